#include "desktop/windows/info/exif_frame.h"

#include <wx/accel.h>
#include <wx/dataview.h>
#include <wx/filedlg.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>

#include "core/text.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/info/text_actions.h"
#include "desktop/windows/metadata/exif_edit_frame.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

ExifFrame::ExifFrame(Shell& shell, wxWindow* parent, const std::string& path)
    : ToolFrame(parent, "EXIF: " + Shown(platform::FileNameOf(path)), "ExifBox"),
      shell_(shell),
      path_(path) {
  problem_ = new wxStaticText(Panel(), wxID_ANY, Label("Reading..."));
  list_ = NewTextList(Panel(), Label("EXIF values"), {{Label("Name"), 270}, {Label("Value"), 330}});
  thumbnail_ = new wxStaticBitmap(Panel(), wxID_ANY, wxBitmapBundle());
  thumbnailFacts_ = new wxStaticText(Panel(), wxID_ANY, wxEmptyString);

  auto* side = new wxBoxSizer(wxVERTICAL);
  side->Add(thumbnail_);
  side->Add(thumbnailFacts_, wxSizerFlags().Border(wxTOP, FromDIP(6)));
  auto* middle = new wxBoxSizer(wxHORIZONTAL);
  middle->Add(list_, wxSizerFlags(1).Expand());
  middle->Add(side, wxSizerFlags().Border(wxLEFT, FromDIP(10)));

  const RowButton rows[] = {
      {wxID_COPY, TrLater("&Copy value"), [this] { CopyText(SelectedValue()); }},
      {wxID_SELECTALL, TrLater("Copy &all"),
       [this] { CopyText(wxString::FromUTF8(report_.text)); }},
      {wxID_SAVEAS, TrLater("&Save as text..."),
       [this] { SaveTextAs(*this, "exif.txt", report_.text); }},
      {wxID_SAVE, TrLater("Save &thumbnail..."), [this] { SaveThumbnail(); }},
      {wxID_PRINT, TrLater("&Print..."), [this] { PrintText(*this, GetTitle(), report_.text); }},
      {wxID_EDIT, TrLater("&Edit..."),
       [this] { (new ExifEditFrame(shell_, GetParent(), {path_}))->Show(); }},
      {wxID_CLOSE, TrLater("C&lose"), [this] { Close(); }},
  };
  LayOut(problem_, *middle, rows,
         {{wxACCEL_CTRL, 'C', wxID_COPY},
          {wxACCEL_CTRL | wxACCEL_SHIFT, 'C', wxID_SELECTALL},
          {wxACCEL_CTRL, 'S', wxID_SAVEAS},
          {wxACCEL_CTRL, 'P', wxID_PRINT}},
         wxSize(880, 620));
  // until the file has been read
  for (const RowButton& row : rows)
    FindWindow(row.id)->Enable(row.id == wxID_CLOSE || row.id == wxID_EDIT);
  list_->SetFocus();
  work_.Start(
      *this,
      [this, options = ExifReportOptionsFromSettings()](const StopToken&) {
        report_ = ReadExifReport(path_, options);
      },
      [this](Status status) {
        if (status != Status::Ok) report_.problem = StatusText(status);
        Finished();
      });
}

void ExifFrame::Finished() {
  if (!report_.rows.empty()) shell_.Uses().NoteAll({path_}, FileFunction::GetInfo);
  problem_->SetLabel(Shown(report_.problem));
  problem_->Show(!report_.problem.empty());
  rows_ = RowsForPeople(report_, settings.ExifShowTypes != 0);
  for (const ExifRow& row : rows_) {
    wxVector<wxVariant> cells;
    cells.push_back((row.heading ? wxString() : wxString("    ")) + Shown(row.name));
    cells.push_back(wxString::FromUTF8(row.text));
    list_->AppendItem(cells);
  }
  if (!report_.rows.empty()) list_->SelectRow(0);
  if (!report_.thumbnail.Empty()) {
    thumbnail_->SetBitmap(BitmapOf(report_.thumbnail, GetContentScaleFactor()));
    thumbnail_->SetName(Label("Thumbnail in the EXIF block"));
  }
  if (!report_.thumbnailBytes.empty()) {
    const std::string size = report_.thumbnail.Empty()
                                 ? std::string(Tr("The thumbnail cannot be decoded"))
                                 : std::to_string(report_.thumbnail.width) + " x " +
                                       std::to_string(report_.thumbnail.height);
    thumbnailFacts_->SetLabel(wxString::FromUTF8(
        size + "\n" + TrGroupedCount("%1 byte", "%1 bytes", report_.thumbnailBytes.size())));
  }
  for (const wxWindowID id : {wxID_COPY, wxID_SELECTALL, wxID_SAVEAS, wxID_PRINT})
    FindWindow(id)->Enable(!report_.rows.empty());
  FindWindow(wxID_SAVE)->Enable(!report_.thumbnailBytes.empty());
  list_->GetParent()->Layout();
  LogEvent("exif", "rows=" + std::to_string(report_.rows.size()) +
                       " thumbnail=" + std::to_string(report_.thumbnail.width));
}

wxString ExifFrame::SelectedValue() const {
  const int row = list_->GetSelectedRow();
  if (row == wxNOT_FOUND) return {};
  const ExifRow& shown = rows_[static_cast<size_t>(row)];
  return wxString::FromUTF8(shown.heading ? shown.name : shown.text);
}

void ExifFrame::SaveThumbnail() {
  const std::string name = std::string(platform::SplitPath(path_).base) + "_thumbnail.jpg";
  wxFileDialog dialog(this, Label("Save thumbnail"), wxEmptyString, Shown(name),
                      Label("JPEG files (*.jpg)|*.jpg"), wxFD_SAVE | wxFD_OVERWRITE_PROMPT);
  if (dialog.ShowModal() != wxID_OK) return;
  const std::string target = Utf8(dialog.GetPath());
  const platform::FileFacts own = platform::FactsOf(path_), other = platform::FactsOf(target);
  const bool itself = other.kind == platform::FileKind::Regular && own.device == other.device &&
                      own.identity == other.identity;
  const std::string_view bytes(reinterpret_cast<const char*>(report_.thumbnailBytes.data()),
                               report_.thumbnailBytes.size());
  if (itself) {
    wxMessageBox(Label("This is the picture itself. Choose another name."), Label("Save thumbnail"),
                 wxOK | wxICON_WARNING, this);
  } else if (!platform::WriteWholeFile(target, bytes)) {
    wxMessageBox(
        Label("\"%1\" could not be written. Choose another folder or name.", dialog.GetPath()),
        Label("Save thumbnail"), wxOK | wxICON_WARNING, this);
  }
}

}  // namespace fotomill::desktop
