#include "desktop/windows/batch/destination_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/dirdlg.h>
#include <wx/msgdlg.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include "core/choice_lists.h"
#include "core/text.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/windows/setup/override_box.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/volumes.h"
#include "registry/registry.h"
#include "settings/history_list.h"
#include "settings/settings.h"

namespace fotomill::desktop {

DestinationDialog::DestinationDialog(wxWindow* parent, const wxString& verb,
                                     const std::vector<std::string>& files)
    : wxDialog(parent, wxID_ANY, verb, wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "DestinationBox"),
      files_(files) {
  const int gap = FromDIP(8);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  const auto below = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap * 3 / 2);

  auto* formatRow = new wxBoxSizer(wxHORIZONTAL);
  formatRow->Add(new wxStaticText(this, wxID_ANY, Label("&Format:")),
                 wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  format_ = new wxChoice(this, wxID_ANY);
  format_->SetName(Label("Format"));
  for (const DestinationFormat& format : formats_) format_->Append(Shown(format.description));
  formatRow->Add(format_, wxSizerFlags(1));
  options_ = new wxButton(this, wxID_ANY, Label("&Options..."));
  formatRow->Add(options_, wxSizerFlags().Border(wxLEFT, gap));
  sizer->Add(formatRow, below);

  beside_ = new wxRadioButton(this, wxID_ANY, Label("&Beside each picture"), wxDefaultPosition,
                              wxDefaultSize, wxRB_GROUP);
  into_ = new wxRadioButton(this, wxID_ANY, Label("&Into the folder"));
  sizer->Add(beside_, below);
  auto* folderRow = new wxBoxSizer(wxHORIZONTAL);
  folder_ = new wxComboBox(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(420, -1)), 0,
                           nullptr, 0, wxDefaultValidator, Label("Folder"));
  for (const std::string& folder : RecentDestinations())
    folder_->Append(wxString::FromUTF8(folder));
  folder_->SetValue(folder_->GetCount() > 0 ? folder_->GetString(0)
                                            : wxString::FromUTF8(std::string(
                                                  platform::SplitPath(files_.front()).folder)));
  folder_->AutoCompleteDirectories();
  browse_ = new wxButton(this, wxID_ANY, Label("B&rowse..."));
  folderRow->Add(into_, wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  folderRow->Add(folder_, wxSizerFlags(1));
  folderRow->Add(browse_, wxSizerFlags().Border(wxLEFT, gap));
  sizer->Add(folderRow, below);

  reduce_ = new wxCheckBox(this, wxID_ANY, Label("Reduce &colors if the format supports fewer"));
  orient_ = new wxCheckBox(this, wxID_ANY, Label("Rotate pictures &upright by EXIF orientation"));
  metadata_ = new wxCheckBox(this, wxID_ANY, Label("&Keep EXIF, XMP and comments"));
  reduce_->SetValue(true);
  orient_->SetValue(settings.ExifAdjustOrientation != 0);
  metadata_->SetValue(settings.PreserveEXIF != 0);
  for (wxCheckBox* box : {reduce_, orient_, metadata_}) sizer->Add(box, below);

  preview_ = new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                              wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_MIDDLE);
  sizer->Add(preview_, below);

  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  // Translators: %2 is what the button does, "Convert".
  ok_ = new wxButton(this, wxID_OK, LabelCount("%2 &%1 file", "%2 &%1 files", files_.size(), verb));
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_CANCEL), wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(ok_);
  sizer->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap * 3 / 2));
  ok_->SetDefault();

  for (size_t i = 0; i < formats_.size(); ++i) {
    if (EqualIgnoringCase(formats_[i].extension, settings.DefaultFileExtension))
      format_->SetSelection(static_cast<int>(i));
  }
  if (format_->GetSelection() == wxNOT_FOUND) format_->SetSelection(0);
  (settings.DestForceSourceDir != 0 ? beside_ : into_)->SetValue(true);
  format_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { UpdateControls(); });
  beside_->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  into_->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  folder_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  browse_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
  options_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ShowFormatOptions(); });
  ok_->Bind(wxEVT_BUTTON, &DestinationDialog::OnOk, this);
  SetSizerAndFit(sizer);
  CentreOnParent();
  UpdateControls();
  ok_->SetFocus();
}

DestinationChoice DestinationDialog::Choice() const {
  DestinationChoice choice;
  choice.extension = formats_[static_cast<size_t>(format_->GetSelection())].extension;
  if (into_->GetValue()) choice.folder = Utf8(folder_->GetValue());
  choice.reduce = reduce_->GetValue();
  choice.autoOrient = orient_->GetValue();
  choice.keepMetadata = metadata_->GetValue();
  return choice;
}

void DestinationDialog::UpdateControls() {
  const DestinationChoice choice = Choice();
  folder_->Enable(into_->GetValue());
  browse_->Enable(into_->GetValue());
  options_->Show(HasOverrideBox(choice.extension));
  const std::string problem = DestinationProblem(choice);
  ok_->Enable(problem.empty() && (!into_->GetValue() || !choice.folder.empty()));
  const std::string first = FirstDestination(choice, files_.front());
  wxString text = problem.empty() ? Label("First: %1", Shown(first)) : Shown(problem);
  const uint64_t space =
      platform::FreeSpace(choice.folder.empty() ? files_.front() : choice.folder);
  if (problem.empty() && space > 0)
    text = Label("%1 (%2 free)", text, Shown(SizeText(space, choice::kSizeFitting)));
  preview_->SetLabel(text);
  Layout();
}

void DestinationDialog::ShowFormatOptions() {
  (void)ShowOverrideBox(this, formats_[static_cast<size_t>(format_->GetSelection())].extension);
}

void DestinationDialog::Browse() {
  wxDirDialog dialog(this, Label("Destination folder"), folder_->GetValue());
  if (dialog.ShowModal() == wxID_OK) folder_->SetValue(dialog.GetPath());
  UpdateControls();
}

// Shift brings up the format's own options on the way.
void DestinationDialog::OnOk(wxCommandEvent& event) {
  if (wxGetKeyState(WXK_SHIFT) && ShiftOpensOverrideBox()) ShowFormatOptions();
  const DestinationChoice choice = Choice();
  if (!choice.folder.empty())
    (void)AddToHistoryList(HistoryList::Destination, platform::AbsolutePath(choice.folder));
  settings.DefaultFileExtension.AssignCut(choice.extension);
  settings.DestForceSourceDir = choice.folder.empty() ? 1 : 0;
  event.Skip();
}

}  // namespace fotomill::desktop
