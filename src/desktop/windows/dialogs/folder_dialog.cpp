#include "desktop/windows/dialogs/folder_dialog.h"

#include <wx/button.h>
#include <wx/combobox.h>
#include <wx/dialog.h>
#include <wx/dirdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"

namespace fotomill::desktop {

std::optional<std::string> AskForFolder(wxWindow& parent, const wxString& title,
                                        const wxString& verb, HistoryList history,
                                        const std::string& first) {
  wxDialog dialog(&parent, wxID_ANY, title, wxDefaultPosition, wxDefaultSize,
                  wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "FolderBox");
  const int gap = dialog.FromDIP(10);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  auto* folder =
      new wxComboBox(&dialog, wxID_ANY, "", wxDefaultPosition, dialog.FromDIP(wxSize(460, -1)), 0,
                     nullptr, wxTE_PROCESS_ENTER, wxDefaultValidator, Label("Folder"));
  const std::string builtIn = platform::SpecialFolderPath(platform::SpecialFolder::Pictures);
  if (!first.empty()) folder->Append(wxString::FromUTF8(first));
  for (const std::string& entry : OfferedEntries(history, builtIn)) {
    if (entry != first) folder->Append(wxString::FromUTF8(entry));
  }
  if (folder->GetCount() > 0) folder->SetSelection(0);
  folder->AutoCompleteDirectories();
  auto* browse = new wxButton(&dialog, wxID_ANY, Label("B&rowse..."));
  row->Add(new wxStaticText(&dialog, wxID_ANY, Label("&To the folder:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  folder->MoveAfterInTabOrder(row->GetItem(size_t{0})->GetWindow());
  row->Add(folder, wxSizerFlags(1));
  row->Add(browse, wxSizerFlags().Border(wxLEFT, gap));
  sizer->Add(row, wxSizerFlags().Expand().Border(wxALL, gap));
  auto* ok = new wxButton(&dialog, wxID_OK, "&" + verb);
  sizer->Add(BuildAnswerRow(dialog, *ok), wxSizerFlags().Expand().Border(wxALL, gap));
  dialog.SetSizerAndFit(sizer);
  dialog.CentreOnParent();
  const auto isFolder = [&] {
    return platform::IsFolder(platform::AbsolutePath(Utf8(folder->GetValue())));
  };
  const auto update = [&] { ok->Enable(!folder->GetValue().empty() && isFolder()); };
  folder->Bind(wxEVT_TEXT, [&](wxCommandEvent&) { update(); });
  folder->Bind(wxEVT_COMBOBOX, [&](wxCommandEvent&) { update(); });
  folder->Bind(wxEVT_TEXT_ENTER, [&](wxCommandEvent&) {
    if (ok->IsEnabled()) dialog.EndModal(wxID_OK);
  });
  browse->Bind(wxEVT_BUTTON, [&](wxCommandEvent&) {
    wxDirDialog choose(&dialog, title, folder->GetValue());
    if (choose.ShowModal() == wxID_OK) folder->SetValue(choose.GetPath());
    update();
  });
  update();
  folder->SetFocus();
  LogEvent("prompt", "folder");
  if (dialog.ShowModal() != wxID_OK) return std::nullopt;
  const std::string answer = platform::AbsolutePath(Utf8(folder->GetValue()));
  (void)AddChoice(history, answer, builtIn);
  return answer;
}

}  // namespace fotomill::desktop
