#include "desktop/windows/archive/archive_dialogs.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/combobox.h>
#include <wx/dialog.h>
#include <wx/dirdlg.h>
#include <wx/filedlg.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include "archive/archive_limits.h"
#include "core/text.h"
#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/existence.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/history_list.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// A dialog of rows below each other.
class RowDialog : public wxDialog {
 protected:
  RowDialog(wxWindow& parent, const wxString& title, const wxString& name)
      : wxDialog(&parent, wxID_ANY, title, wxDefaultPosition, wxDefaultSize,
                 wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, name) {
    SetSizer(new wxBoxSizer(wxVERTICAL));
  }
  virtual void Browse() = 0;
  virtual void UpdateControls() = 0;

  wxSizerFlags Below() const {
    return wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(10));
  }
  wxCheckBox* AddFlag(const wxString& label, bool value) {
    auto* box = new wxCheckBox(this, wxID_ANY, label);
    box->SetValue(value);
    GetSizer()->Add(box, Below());
    return box;
  }
  // A labeled field with a button that asks for its value.
  wxComboBox* AddPath(const wxString& label, const std::vector<std::string>& offered) {
    GetSizer()->Add(new wxStaticText(this, wxID_ANY, label), Below());
    auto* row = new wxBoxSizer(wxHORIZONTAL);
    auto* field =
        new wxComboBox(this, wxID_ANY, "", wxDefaultPosition, wxSize(TextWidth(*this, 420), -1));
    field->SetName(wxControl::RemoveMnemonics(label));
    for (const std::string& item : offered) field->Append(wxString::FromUTF8(item));
    if (!offered.empty()) field->SetSelection(0);
    auto* button = new wxButton(this, wxID_ANY, Label("&Browse..."));
    field->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
    button->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
    row->Add(field, wxSizerFlags(1));
    row->Add(button, wxSizerFlags().Border(wxLEFT, FromDIP(6)));
    GetSizer()->Add(row, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, FromDIP(10)));
    return field;
  }
  // `kept`: the last size in device-independent pixels; 0: none.
  void Finish(const wxString& label, const wxSize& kept) {
    ok_ = new wxButton(this, wxID_OK, label);
    GetSizer()->Add(BuildAnswerRow(*this, *ok_),
                    wxSizerFlags().Expand().Border(wxALL, FromDIP(10)));
    UpdateControls();
    GetSizer()->SetSizeHints(this);
    const wxSize size = FromDIP(kept), least = GetSize();
    SetSize(wxSize(std::max(size.x, least.x), std::max(size.y, least.y)));
    CentreOnParent();
  }

  wxButton* ok_ = nullptr;  // null until the dialog is complete
};

// --- extracting ---

class ExtractDialog : public RowDialog {
 public:
  ExtractDialog(wxWindow& parent, const std::string& archive, size_t count, size_t selected);
  ~ExtractDialog() override;
  ExtractChoice Choice() const;
  void Keep() const;

 private:
  std::vector<std::string> Offered() const;
  void Browse() override;
  void UpdateControls() override {
    if (ok_ != nullptr) ok_->Enable(!folder_->GetValue().empty());
  }

  const std::string beside_;
  wxRadioButton* all_ = nullptr;
  wxRadioButton* selected_ = nullptr;
  wxComboBox* folder_ = nullptr;
  wxCheckBox* paths_ = nullptr;
  wxCheckBox* times_ = nullptr;
};

ExtractDialog::ExtractDialog(wxWindow& parent, const std::string& archive, size_t count,
                             size_t selected)
    : RowDialog(parent, Label("Extract"), "ExtractBox"), beside_(platform::FolderOf(archive)) {
  all_ = new wxRadioButton(this, wxID_ANY, LabelCount("&All %1 file", "&All %1 files", count),
                           wxDefaultPosition, wxDefaultSize, wxRB_GROUP);
  selected_ = new wxRadioButton(this, wxID_ANY,
                                LabelCount("&Selected: %1 file", "&Selected: %1 files", selected));
  selected_->Enable(selected > 0);
  (selected > 1 ? selected_ : all_)->SetValue(true);
  GetSizer()->Add(all_, Below());
  GetSizer()->Add(selected_, Below());
  folder_ = AddPath(Label("Into the &folder:"), Offered());
  folder_->AutoCompleteDirectories();
  paths_ = AddFlag(Label("&Keep the folders of the archive"), settings.ArchivePreservePaths != 0);
  times_ = AddFlag(Label("Keep file &times"), settings.ArchivePreserveTimestamps != 0);
  Finish(Label("&Extract"), wxSize(settings.ArchiveCopyWidth, settings.ArchiveCopyDepth));
  ok_->SetFocus();
}

// ArchiveExtractPath, the last folders, the folder of the archive.
std::vector<std::string> ExtractDialog::Offered() const {
  std::vector<std::string> offered = OfferedEntries(HistoryList::Archives, beside_);
  const std::string given(settings.ArchiveExtractPath.view());
  std::erase(offered, given);
  if (!given.empty()) offered.insert(offered.begin(), given);
  return offered;
}

void ExtractDialog::Browse() {
  wxDirDialog dialog(this, Label("Destination folder"), folder_->GetValue());
  if (dialog.ShowModal() == wxID_OK) folder_->SetValue(dialog.GetPath());
}

ExtractDialog::~ExtractDialog() {
  settings.ArchiveCopyWidth = ToDIP(GetSize()).x;
  settings.ArchiveCopyDepth = ToDIP(GetSize()).y;
  (void)SaveConfiguration();
}

ExtractChoice ExtractDialog::Choice() const {
  return {WholeFolder(Utf8(folder_->GetValue()), beside_), selected_->GetValue()};
}

void ExtractDialog::Keep() const {
  settings.ArchivePreservePaths = paths_->GetValue() ? 1 : 0;
  settings.ArchivePreserveTimestamps = times_->GetValue() ? 1 : 0;
  (void)AddChoice(HistoryList::Archives, Choice().folder, beside_);
}

// --- creating ---

class CreateDialog : public RowDialog {
 public:
  CreateDialog(wxWindow& parent, const std::vector<std::string>& files);
  ~CreateDialog() override;
  CreateChoice Choice() const;
  void Keep() const;

 private:
  wxTextCtrl* AddPassword(const wxString& label);
  void Browse() override;
  void UpdateControls() override;

  const std::string folder_;
  wxComboBox* path_ = nullptr;
  wxCheckBox* add_ = nullptr;
  wxCheckBox* paths_ = nullptr;
  wxCheckBox* thumbnails_ = nullptr;
  wxTextCtrl* password_ = nullptr;
  wxTextCtrl* again_ = nullptr;  // null if the password is shown
  wxStaticText* problem_ = nullptr;
};

CreateDialog::CreateDialog(wxWindow& parent, const std::vector<std::string>& files)
    : RowDialog(parent, Label("Create archive"), "CreateArchiveBox"),
      folder_(FolderForResults(platform::FolderOf(files.front()))) {
  const std::string folder = platform::AbsolutePath(folder_);  // without the separator at its end
  const std::string name(files.size() == 1 ? platform::SplitPath(files.front()).base
                                           : platform::FileNameOf(folder));
  path_ = AddPath(Label("ZIP &archive:"), {platform::JoinFolder(folder_, name + ".zip")});
  add_ = AddFlag(Label("A&dd to the existing archive"), true);
  paths_ = AddFlag(Label("&Keep the folders"), settings.ArchivePreservePaths != 0);
  thumbnails_ = AddFlag(Label("Include &thumbnail files"), settings.ArchiveAddThumbnails != 0);
  password_ = AddPassword(Label("&Password (empty: none):"));
  if (settings.ArchiveMaskPassword != 0) again_ = AddPassword(Label("Password a&gain:"));
  problem_ =
      new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxST_NO_AUTORESIZE);
  GetSizer()->Add(problem_, Below());
  Finish(LabelCount("Archi&ve %1 item", "Archi&ve %1 items", files.size()),
         wxSize(settings.ArchiveOptionsOpenWidth, settings.ArchiveOptionsOpenDepth));
  path_->SetFocus();
}

CreateDialog::~CreateDialog() {
  settings.ArchiveOptionsOpenWidth = ToDIP(GetSize()).x;
  settings.ArchiveOptionsOpenDepth = ToDIP(GetSize()).y;
  (void)SaveConfiguration();
}

wxTextCtrl* CreateDialog::AddPassword(const wxString& label) {
  GetSizer()->Add(new wxStaticText(this, wxID_ANY, label), Below());
  auto* field = new wxTextCtrl(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                               settings.ArchiveMaskPassword != 0 ? wxTE_PASSWORD : 0);
  field->SetName(wxControl::RemoveMnemonics(label));
  field->SetMaxLength(kLongestPassword / 4);  // bytes
  field->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  GetSizer()->Add(field, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, FromDIP(10)));
  return field;
}

void CreateDialog::Browse() {
  wxFileDialog dialog(this, Label("Create archive"), wxString::FromUTF8(folder_), "",
                      Label("ZIP archives (*.zip)|*.zip"), wxFD_SAVE);
  if (dialog.ShowModal() == wxID_OK) path_->SetValue(dialog.GetPath());
}

CreateChoice CreateDialog::Choice() const {
  CreateChoice choice;
  choice.path = WholeFolder(Utf8(path_->GetValue()), folder_);
  if (!EqualIgnoringCase(platform::ExtensionOf(choice.path), "zip")) choice.path += ".zip";
  choice.password = Utf8(password_->GetValue());
  choice.add = add_->IsEnabled() && add_->GetValue();
  return choice;
}

void CreateDialog::UpdateControls() {
  if (ok_ == nullptr) return;  // not complete yet
  add_->Enable(platform::ExistenceOf(Choice().path) == platform::Existence::Yes);
  const bool same = again_ == nullptr || again_->GetValue() == password_->GetValue();
  problem_->SetLabel(same ? wxString() : Label("The passwords differ."));
  ok_->Enable(same && !path_->GetValue().empty());
}

void CreateDialog::Keep() const {
  settings.ArchivePreservePaths = paths_->GetValue() ? 1 : 0;
  settings.ArchiveAddThumbnails = thumbnails_->GetValue() ? 1 : 0;
}

}  // namespace

std::optional<ExtractChoice> AskForExtraction(wxWindow& parent, const std::string& archive,
                                              size_t count, size_t selected) {
  ExtractDialog dialog(parent, archive, count, selected);
  LogEvent("prompt", "extract");
  if (dialog.ShowModal() != wxID_OK) return {};
  dialog.Keep();
  return dialog.Choice();
}

std::optional<CreateChoice> AskForArchive(wxWindow& parent, const std::vector<std::string>& files) {
  CreateDialog dialog(parent, files);
  LogEvent("prompt", "archive");
  if (dialog.ShowModal() != wxID_OK) return {};
  dialog.Keep();
  return dialog.Choice();
}

}  // namespace fotomill::desktop
