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
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/setup/override_box.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "settings/history_list.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"

namespace fotomill::desktop {

DestinationDialog::DestinationDialog(wxWindow* parent, const wxString& verb,
                                     const std::vector<std::string>& files,
                                     std::vector<NamedSize> sizes)
    : wxDialog(parent, wxID_ANY, verb, wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "DestinationBox"),
      files_(files),
      shownFolder_(platform::FolderOf(files_.front())),
      sizes_(std::move(sizes)) {
  const int gap = FromDIP(8);
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  const auto below = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap * 3 / 2);

  if (!sizes_.empty()) sizer->Add(NewSizeRow(), below);
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
                                            : wxString::FromUTF8(shownFolder_));
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
  orient_->Show(sizes_.empty());  // operations always do

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
  options_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { (void)ShowFormatOptions(); });
  ok_->Bind(wxEVT_BUTTON,
            [this](wxCommandEvent& event) { event.Skip(Accept(wxGetKeyState(WXK_SHIFT))); });
  Bind(wxEVT_CHAR_HOOK, &DestinationDialog::OnKey, this);
  SetSizerAndFit(sizer);
  CentreOnParent();
  UpdateControls();
  ok_->SetFocus();
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

DestinationChoice DestinationDialog::Choice() const {
  DestinationChoice choice;
  choice.extension = formats_[static_cast<size_t>(format_->GetSelection())].extension;
  if (into_->GetValue()) choice.folder = WholeFolder(Utf8(folder_->GetValue()), shownFolder_);
  choice.reduce = reduce_->GetValue();
  choice.autoOrient = orient_->GetValue();
  choice.keepMetadata = metadata_->GetValue();
  if (size_ != nullptr) choice.step = sizes_[static_cast<size_t>(size_->GetSelection())].step;
  return choice;
}

void DestinationDialog::UpdateControls() {
  const DestinationChoice choice = Choice();
  folder_->Enable(into_->GetValue());
  browse_->Enable(into_->GetValue());
  options_->Show(HasOverrideBox(choice.extension));
  const std::string problem = DestinationProblem(choice);
  ok_->Enable(problem.empty() && (!into_->GetValue() || !choice.folder.empty()));
  const std::string outlook = problem.empty() ? OutlookText(choice) : problem;
  LogEvent("destination", outlook);
  preview_->SetLabel(Shown(outlook));
  Layout();
}

// "First: /photos/a.png (18.2 GB free), 3 outputs exist already"
std::string DestinationDialog::OutlookText(const DestinationChoice& choice) const {
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

// The toolkit's default button knows Enter alone; Shift+Enter is OK with Shift held.
void DestinationDialog::OnKey(wxKeyEvent& event) {
  const bool enter = event.GetKeyCode() == WXK_RETURN || event.GetKeyCode() == WXK_NUMPAD_ENTER;
  if (!enter || event.GetModifiers() != wxMOD_SHIFT) return event.Skip();
  if (ok_->IsEnabled() && Accept(true)) EndModal(wxID_OK);
}

// Takes the choice. Shift brings up the format's own options on the way; Cancel in them goes back
// to this step.
bool DestinationDialog::Accept(bool shift) {
  const bool options = shift && ShiftOpensOverrideBox() && HasOverrideBox(Choice().extension);
  if (options && !ShowFormatOptions()) return false;
  const DestinationChoice choice = Choice();
  if (!choice.folder.empty())
    (void)AddToHistoryList(HistoryList::Destination, platform::AbsolutePath(choice.folder));
  settings.DefaultFileExtension.AssignCut(choice.extension);
  settings.DestForceSourceDir = choice.folder.empty() ? 1 : 0;
  return true;
}

}  // namespace fotomill::desktop
