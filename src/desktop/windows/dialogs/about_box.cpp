#include "desktop/windows/dialogs/about_box.h"

#include <wx/button.h>
#include <wx/clipbrd.h>
#include <wx/dataobj.h>
#include <wx/dialog.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/utils.h>

#include <string>
#include <vector>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/app_icon.h"
#include "desktop/windows/widgets/wx_text.h"
#include "registry/about.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

std::vector<Library> Libraries() {
  const wxVersionInfo toolkit = wxGetLibraryVersionInfo();
  const OwnLibrary own[] = {
      {"wxWidgets",
       Utf8(wxString::Format("%d.%d.%d", toolkit.GetMajor(), toolkit.GetMinor(),
                             toolkit.GetMicro())),
       Linking::Shared},
      {"GLib", "", Linking::Shared},
  };
  return LibrariesOf(own);
}

// For reports about faults.
std::string VersionsText(const std::vector<Library>& libraries) {
  std::string text = std::string(kProgramName) + " " + kProgramVersion + " (" + kBuildDate + "), " +
                     Utf8(wxGetOsDescription()) + "\n";
  for (const Library& library : libraries) text += library.name + " " + VersionText(library) + "\n";
  return text;
}

void CopyText(const std::string& text) {
  const wxClipboardLocker lock;
  if (!lock) return;
  wxTheClipboard->SetData(new wxTextDataObject(wxString::FromUTF8(text)));
  LogEvent("about", "copied");
}

wxSizer* BuildHead(wxDialog& dialog) {
  auto* head = new wxBoxSizer(wxHORIZONTAL);
  head->Add(new wxStaticBitmap(&dialog, wxID_ANY, AppIcon(64)),
            wxSizerFlags().CenterVertical().Border(wxRIGHT, dialog.FromDIP(16)));
  auto* texts = new wxBoxSizer(wxVERTICAL);
  auto* name = new wxStaticText(&dialog, wxID_ANY, kProgramName);
  name->SetFont(name->GetFont().Bold().Scaled(1.5f));
  texts->Add(name);
  texts->Add(new wxStaticText(&dialog, wxID_ANY,
                              Label("Version %1, built on %2", kProgramVersion, kBuildDate)),
             wxSizerFlags().Border(wxTOP, dialog.FromDIP(4)));
  texts->Add(new wxStaticText(&dialog, wxID_ANY, Label(kLicenseNote)),
             wxSizerFlags().Border(wxTOP, dialog.FromDIP(4)));
  head->Add(texts, wxSizerFlags(1).CenterVertical());
  return head;
}

}  // namespace

void ShowAboutBox(wxWindow& parent) {
  wxDialog dialog(&parent, wxID_ANY, Label("About %1", kProgramName), wxDefaultPosition,
                  wxDefaultSize, wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "AboutBox");
  const int gap = dialog.FromDIP(12);
  const std::vector<Library> libraries = Libraries();
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(BuildHead(dialog), wxSizerFlags().Expand().Border(wxALL, gap));
  column->Add(new wxStaticText(&dialog, wxID_ANY, Label("&Libraries and their licenses:")),
              wxSizerFlags().Border(wxLEFT | wxRIGHT, gap));
  std::string licenses = LicensesText(libraries);
  licenses.erase(0, licenses.find_first_not_of('\n'));
  auto* text = new wxTextCtrl(&dialog, wxID_ANY, wxString::FromUTF8(licenses), wxDefaultPosition,
                              dialog.FromDIP(wxSize(520, 280)),
                              wxTE_MULTILINE | wxTE_READONLY | wxTE_BESTWRAP);
  column->Add(text, wxSizerFlags(1).Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap / 2));
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  auto* copy = new wxButton(&dialog, wxID_ANY, Label("&Copy versions"));
  copy->SetToolTip(Label("Copies the versions of the program and its libraries to the clipboard."));
  copy->Bind(wxEVT_BUTTON, [&](wxCommandEvent&) { CopyText(VersionsText(libraries)); });
  auto* close = new wxButton(&dialog, wxID_CLOSE);
  close->Bind(wxEVT_BUTTON, [&dialog](wxCommandEvent&) { dialog.EndModal(wxID_CLOSE); });
  row->Add(copy);
  row->AddStretchSpacer();
  row->Add(close);
  column->Add(row, wxSizerFlags().Expand().Border(wxALL, gap));
  dialog.SetSizerAndFit(column);
  dialog.SetEscapeId(wxID_CLOSE);
  close->SetDefault();
  close->SetFocus();
  dialog.CentreOnParent();
  LogEvent("about", "libraries=" + std::to_string(libraries.size()));
  dialog.ShowModal();
}

}  // namespace fotomill::desktop
