#include "desktop/windows/batch/destination_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/dirdlg.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "core/choice_lists.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/setup/override_box.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"

namespace fotomill::desktop {

DestinationDialog::DestinationDialog(wxWindow* parent, const wxString& verb,
                                     const std::vector<std::string>& files,
                                     std::vector<NamedSize> sizes, std::string recipe)
    : wxDialog(parent, wxID_ANY, verb, wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "DestinationBox"),
      files_(files),
      shownFolder_(FolderForResults(platform::FolderOf(files_.front()))),
      sizes_(std::move(sizes)),
      recipe_(std::move(recipe)),
      ownFormats_(RecipeNamesFormats(recipe_)) {
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  BuildFormat();
  BuildOptions();
  BuildFolder();
  sizer->Add(formatSizer_, wxSizerFlags().Expand());
  sizer->Add(folderSizer_, wxSizerFlags().Expand());
  preview_ = new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                              wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_MIDDLE);
  sizer->Add(preview_, Below());
  SetSizer(sizer);
  BuildButtons(verb);
  BindControls();
  sizer->SetSizeHints(this);
  ShowPart(0);
  CentreOnParent();
}

wxSizerFlags DestinationDialog::Below() const {
  return wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(12));
}

void DestinationDialog::BuildFormat() {
  const int gap = FromDIP(8);
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(this, wxID_ANY, Label("&Format:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  format_ = new wxChoice(this, wxID_ANY);
  format_->SetName(Label("Format"));
  for (const DestinationFormat& format : formats_) format_->Append(Shown(format.description));
  format_->SetSelection(static_cast<int>(FirstFormat(formats_)));
  row->Add(format_, wxSizerFlags(1));
  options_ = new wxButton(this, wxID_ANY, Label("&Options..."));
  row->Add(options_, wxSizerFlags().Border(wxLEFT, gap));
  formatSizer_ = new wxBoxSizer(wxVERTICAL);
  if (!sizes_.empty()) formatSizer_->Add(NewSizeRow(), Below());
  formatSizer_->Add(row, Below());
  if (!ownFormats_) return;
  format_->Disable();
  format_->SetToolTip(Label("The recipe decides the format."));
}

wxSizer* DestinationDialog::NewSizeRow() {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(this, wxID_ANY, Label("&Size:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(8)));
  size_ = new wxChoice(this, wxID_ANY);
  size_->SetName(Label("Size"));
  for (const NamedSize& size : sizes_) size_->Append(Shown(size.text));
  size_->SetSelection(0);
  size_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { UpdateControls(); });
  row->Add(size_, wxSizerFlags(1));
  return row;
}

void DestinationDialog::BuildFolder() {
  const int gap = FromDIP(8);
  folderSizer_ = new wxBoxSizer(wxVERTICAL);
  beside_ = new wxRadioButton(this, wxID_ANY, Label("&Beside each picture"), wxDefaultPosition,
                              wxDefaultSize, wxRB_GROUP);
  into_ = new wxRadioButton(this, wxID_ANY, Label("&Into the folder"));
  // the folder of an unpacked archive is temporary
  const bool temporary = shownFolder_ != platform::FolderOf(files_.front());
  beside_->Enable(!temporary);
  (settings.DestForceSourceDir != 0 && !temporary ? beside_ : into_)->SetValue(true);
  folderSizer_->Add(beside_, Below());
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  folder_ = new wxComboBox(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(420, -1)), 0,
                           nullptr, 0, wxDefaultValidator, Label("Folder"));
  for (const std::string& folder : RecentDestinations(shownFolder_))
    folder_->Append(wxString::FromUTF8(folder));
  folder_->SetSelection(0);
  folder_->AutoCompleteDirectories();
  browse_ = new wxButton(this, wxID_ANY, Label("B&rowse..."));
  row->Add(into_, wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  row->Add(folder_, wxSizerFlags(1));
  row->Add(browse_, wxSizerFlags().Border(wxLEFT, gap));
  folderSizer_->Add(row, Below());
}

// Shown together with the format.
void DestinationDialog::BuildOptions() {
  reduce_ = new wxCheckBox(this, wxID_ANY, Label("Reduce &colors if the format supports fewer"));
  orient_ = new wxCheckBox(this, wxID_ANY, Label("Rotate pictures &upright by EXIF orientation"));
  metadata_ = new wxCheckBox(this, wxID_ANY, Label("&Keep EXIF, XMP and comments"));
  reduce_->SetValue(true);
  orient_->SetValue(settings.ExifAdjustOrientation != 0);
  metadata_->SetValue(settings.PreserveEXIF != 0);
  for (wxCheckBox* box : {reduce_, orient_, metadata_}) formatSizer_->Add(box, Below());
  if (settings.PromptForFileComments == 0) return;
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  row->Add(new wxStaticText(this, wxID_ANY, Label("Co&mment:")),
           wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(8)));
  comment_ = new wxTextCtrl(this, wxID_ANY);
  comment_->SetName(Label("Comment"));
  comment_->SetHint(Label("Empty: each picture keeps its own"));
  row->Add(comment_, wxSizerFlags(1));
  formatSizer_->Add(row, Below());
}

void DestinationDialog::BuildButtons(const wxString& verb) {
  const int gap = FromDIP(8);
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  // Translators: %2 is what the button does, "Convert".
  okText_ = LabelCount("%2 &%1 file", "%2 &%1 files", files_.size(), verb);
  ok_ = new wxButton(this, wxID_OK, okText_);
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_CANCEL), wxSizerFlags().Border(wxRIGHT, gap));
  buttons->Add(ok_);
  GetSizer()->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap * 3 / 2));
  ok_->SetDefault();
}

void DestinationDialog::BindControls() {
  format_->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) { UpdateControls(); });
  beside_->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  into_->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  folder_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  metadata_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { UpdateControls(); });
  browse_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
  options_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { (void)ShowFormatOptions(); });
  ok_->Bind(wxEVT_BUTTON,
            [this](wxCommandEvent& event) { event.Skip(Accept(wxGetKeyState(WXK_SHIFT))); });
  Bind(wxEVT_CHAR_HOOK, &DestinationDialog::OnKey, this);
}

void DestinationDialog::ShowPart(size_t part) {
  part_ = part;
  const bool format = parts_[part] != DestinationPart::Folder;
  GetSizer()->Show(formatSizer_, format, true);
  orient_->Show(format && sizes_.empty() && recipe_.empty());  // operations always do this
  GetSizer()->Show(folderSizer_, parts_[part] != DestinationPart::Format, true);
  ok_->SetLabel(part + 1 < parts_.size() ? Label("Nex&t") : okText_);
  UpdateControls();
  Fit();
  ok_->SetFocus();
  static constexpr const char* kNames[] = {"format", "folder", "both"};
  LogEvent("destination-part", kNames[static_cast<size_t>(parts_[part])]);
}

DestinationChoice DestinationDialog::Choice() const {
  DestinationChoice choice;
  choice.step = recipe_;
  choice.extension = formats_[static_cast<size_t>(format_->GetSelection())].extension;
  if (into_->GetValue()) choice.folder = WholeFolder(Utf8(folder_->GetValue()), shownFolder_);
  choice.reduce = reduce_->GetValue();
  choice.autoOrient = orient_->GetValue();
  choice.keepMetadata = metadata_->GetValue();
  if (size_ != nullptr) choice.step = sizes_[static_cast<size_t>(size_->GetSelection())].step;
  if (comment_ != nullptr && choice.keepMetadata) choice.comment = Utf8(comment_->GetValue());
  return choice;
}

void DestinationDialog::UpdateControls() {
  const DestinationChoice choice = Choice();
  folder_->Enable(into_->GetValue());
  browse_->Enable(into_->GetValue());
  if (comment_ != nullptr) comment_->Enable(choice.keepMetadata);
  options_->Show(parts_[part_] != DestinationPart::Folder && HasOverrideBox(choice.extension) &&
                 !ownFormats_);
  const std::string problem = DestinationProblem(choice);
  ok_->Enable(problem.empty() && (!into_->GetValue() || !choice.folder.empty()));
  const std::string outlook = problem.empty() ? OutlookText(choice) : problem;
  LogEvent("destination", outlook);
  preview_->SetLabel(Shown(outlook));
  Layout();
}

// "First: /photos/a.png (18.2 GB free), 3 outputs exist already"
std::string DestinationDialog::OutlookText(const DestinationChoice& choice) const {
  if (ownFormats_) return Tr("The recipe decides formats and names.");
  const DestinationOutlook outlook = OutlookOf(choice, files_);
  std::string text = Tr("First: %1", outlook.first);
  if (outlook.freeSpace > 0)
    text = Tr("%1 (%2 free)", text, SizeText(outlook.freeSpace, choice::kSizeFitting));
  if (outlook.existing > 0)
    text.append(", ").append(
        TrGroupedCount("%1 output exists already", "%1 outputs exist already", outlook.existing));
  return text;
}

bool DestinationDialog::ShowFormatOptions() {
  const std::string& extension = formats_[static_cast<size_t>(format_->GetSelection())].extension;
  LogEvent("prompt", "options " + extension);
  return ShowOverrideBox(this, extension);
}

void DestinationDialog::Browse() {
  wxDirDialog dialog(this, Label("Destination folder"), folder_->GetValue());
  if (dialog.ShowModal() == wxID_OK) folder_->SetValue(dialog.GetPath());
  UpdateControls();
}

// The toolkit's default button only reacts to Enter; Shift+Enter is OK with Shift held.
void DestinationDialog::OnKey(wxKeyEvent& event) {
  const bool enter = event.GetKeyCode() == WXK_RETURN || event.GetKeyCode() == WXK_NUMPAD_ENTER;
  if (!enter || event.GetModifiers() != wxMOD_SHIFT) return event.Skip();
  if (ok_->IsEnabled() && Accept(true)) EndModal(wxID_OK);
}

// Accepts the choice, or goes on to the next part. With Shift, shows the format's options first;
// canceling them returns to this step.
bool DestinationDialog::Accept(bool shift) {
  const bool options = shift && ShiftOpensOverrideBox() && HasOverrideBox(Choice().extension) &&
                       parts_[part_] != DestinationPart::Folder;
  if (options && !ShowFormatOptions()) return false;
  if (part_ + 1 < parts_.size()) {
    ShowPart(part_ + 1);
    return false;
  }
  KeepChoice(Choice(), shownFolder_);
  return true;
}

}  // namespace fotomill::desktop
