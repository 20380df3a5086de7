#include "desktop/windows/info/text_actions.h"

#include <wx/clipbrd.h>
#include <wx/dataobj.h>
#include <wx/dc.h>
#include <wx/filedlg.h>
#include <wx/msgdlg.h>
#include <wx/print.h>
#include <wx/printdlg.h>
#include <wx/tokenzr.h>

#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"

namespace fotomill::desktop {

namespace {

constexpr int kLinesOfAPage = 66;
constexpr size_t kCharactersOfALine = 92;

// Splits a text into printed lines: expands tabs, wraps long lines.
wxArrayString PrintedLines(const std::string& text) {
  wxArrayString lines;
  wxStringTokenizer tokens(wxString::FromUTF8(text.data(), text.size()), "\n", wxTOKEN_RET_EMPTY);
  while (tokens.HasMoreTokens()) {
    wxString line = tokens.GetNextToken();
    line.Replace("\t", "  ");
    do {
      lines.Add(line.Left(kCharactersOfALine));
      line = line.Mid(kCharactersOfALine);
    } while (!line.empty());
  }
  return lines;
}

class TextPrintout : public wxPrintout {
 public:
  TextPrintout(const wxString& title, const std::string& text)
      : wxPrintout(title), title_(title), lines_(PrintedLines(text)) {}

  bool HasPage(int page) override { return page >= 1 && page <= Pages(); }
  void GetPageInfo(int* first, int* last, int* from, int* to) override {
    *first = *from = 1;
    *last = *to = Pages();
  }
  bool OnPrintPage(int page) override {
    wxDC* const dc = GetDC();
    if (dc == nullptr) return false;
    const wxRect paper = GetLogicalPageRect();
    const int margin = paper.width / 12, height = (paper.height - 2 * margin) / (kLinesOfAPage + 2);
    wxFont font(wxFontInfo(wxSize(0, height * 4 / 5)).Family(wxFONTFAMILY_TELETYPE));
    dc->SetFont(font);
    int y = paper.y + margin;
    dc->DrawText(wxString::Format("%s - %d", title_, page), paper.x + margin, y);
    const auto first = static_cast<size_t>((page - 1) * kLinesOfAPage);
    for (size_t i = first; i < lines_.size() && i < first + kLinesOfAPage; ++i) {
      dc->DrawText(lines_[i], paper.x + margin, y + height * static_cast<int>(i - first + 2));
    }
    return true;
  }

 private:
  int Pages() const {
    return std::max(1, (static_cast<int>(lines_.size()) + kLinesOfAPage - 1) / kLinesOfAPage);
  }

  const wxString title_;
  const wxArrayString lines_;
};

}  // namespace

void CopyText(const wxString& text) {
  if (!wxTheClipboard->Open()) return;
  wxTheClipboard->SetData(new wxTextDataObject(text));
  wxTheClipboard->Close();
}

void SaveTextAs(wxWindow& parent, const wxString& name, const std::string& text) {
  wxFileDialog dialog(&parent, Label("Save as text"), wxEmptyString, name,
                      Label("Text files (*.txt)|*.txt|All files|*"),
                      wxFD_SAVE | wxFD_OVERWRITE_PROMPT);
  if (dialog.ShowModal() != wxID_OK) return;
  if (platform::WriteWholeFile(Utf8(dialog.GetPath()), text)) return;
  wxMessageBox(
      Label("\"%1\" could not be written. Choose another folder or name.", dialog.GetPath()),
      Label("Save as text"), wxOK | wxICON_WARNING, &parent);
}

void PrintText(wxWindow& parent, const wxString& title, const std::string& text) {
  wxPrinter printer;
  TextPrintout printout(title, text);
  if (!printer.Print(&parent, &printout, true) && wxPrinter::GetLastError() == wxPRINTER_ERROR) {
    wxMessageBox(Label("Printer error."), Label("Print"), wxOK | wxICON_WARNING, &parent);
  }
}

}  // namespace fotomill::desktop
