#include "desktop/windows/dialogs/welcome_box.h"

#include <wx/button.h>
#include <wx/dialog.h>
#include <wx/dirdlg.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <vector>

#include "core/choice_lists.h"
#include "desktop/models/setup/language_choice.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/shell/favorites.h"
#include "desktop/windows/setup/language_panel.h"
#include "desktop/windows/widgets/app_icon.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "registry/about.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// The ways to keep thumbnails.
struct Keeping {
  const char* label;
  int32_t mode;    // DefaultThumbnailMode
  int32_t offers;  // UpdateThumbnailsFlag
};
constexpr Keeping kKeepings[] = {
    {TrLater("Keep thumbnails in the &data folder of the program"), choice::kDiskBased, 0},
    {TrLater("Offer to keep them in &files beside the pictures"), choice::kDiskBased, 1},
    {TrLater("Do &not keep them"), choice::kVirtual, 0},
};

class WelcomeBox : public wxDialog {
 public:
  WelcomeBox();
  std::string Folder() const { return platform::AbsolutePath(Utf8(folder_->GetValue())); }
  const Keeping& Thumbnails() const;
  std::string Language() const { return language_->Chosen(); }

 private:
  void AddHead();
  void AddFolder();
  void AddHeading(const char* text);
  void UpdateControls();

  wxBoxSizer* const column_ = new wxBoxSizer(wxVERTICAL);
  const int gap_ = FromDIP(12);
  wxTextCtrl* folder_ = nullptr;
  std::vector<wxRadioButton*> keepings_;  // in the order of kKeepings
  LanguagePanel* language_ = nullptr;
  wxButton* start_ = nullptr;
};

WelcomeBox::WelcomeBox()
    : wxDialog(nullptr, wxID_ANY, Label("Welcome"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE, "WelcomeBox") {
  AddHead();
  AddFolder();
  AddHeading(TrLater("Thumbnails"));
  for (const Keeping& keeping : kKeepings) {
    const bool first = keepings_.empty();
    auto* button = new wxRadioButton(this, wxID_ANY, Label(keeping.label), wxDefaultPosition,
                                     wxDefaultSize, first ? wxRB_GROUP : 0);
    button->SetValue(first);
    column_->Add(button, wxSizerFlags().Border(wxLEFT | wxRIGHT | wxTOP, gap_ / 2));
    keepings_.push_back(button);
  }
  language_ = new LanguagePanel(this);
  column_->Add(language_, wxSizerFlags().Border(wxTOP, FromDIP(18)));
  start_ = new wxButton(this, wxID_OK, Label("&Start"));
  column_->AddSpacer(gap_);
  column_->Add(BuildAnswerRow(*this, *start_), wxSizerFlags().Expand().Border(wxTOP, gap_));
  FindWindow(wxID_CANCEL)->SetLabel(Label("S&kip"));
  auto* margins = new wxBoxSizer(wxVERTICAL);
  margins->Add(column_, wxSizerFlags(1).Expand().Border(wxALL, FromDIP(20)));
  SetSizerAndFit(margins);
  UpdateControls();
  folder_->SetFocus();
  CentreOnScreen();
}

void WelcomeBox::AddHead() {
  auto* head = new wxBoxSizer(wxHORIZONTAL);
  head->Add(new wxStaticBitmap(this, wxID_ANY, AppIcon(64)),
            wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(16)));
  auto* texts = new wxBoxSizer(wxVERTICAL);
  auto* title = new wxStaticText(this, wxID_ANY, Label("Welcome to %1", kProgramName));
  title->SetFont(title->GetFont().Bold().Scaled(1.5f));
  texts->Add(title);
  texts->Add(
      new wxStaticText(this, wxID_ANY, Label("You can change all this in Setup at any time.")),
      wxSizerFlags().Border(wxTOP, FromDIP(4)));
  head->Add(texts, wxSizerFlags(1).CenterVertical());
  column_->Add(head, wxSizerFlags().Expand());
}

void WelcomeBox::AddFolder() {
  AddHeading(TrLater("Where are your pictures?"));
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  folder_ = new wxTextCtrl(
      this, wxID_ANY, Shown(platform::SpecialFolderPath(platform::SpecialFolder::Pictures)),
      wxDefaultPosition, FromDIP(wxSize(360, -1)), 0, wxDefaultValidator,
      Label("Where are your pictures?"));
  folder_->AutoCompleteDirectories();
  folder_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  auto* browse = new wxButton(this, wxID_ANY, Label("&Browse..."));
  browse->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    wxDirDialog choose(this, Label("Where are your pictures?"), folder_->GetValue());
    if (choose.ShowModal() == wxID_OK) folder_->SetValue(choose.GetPath());
  });
  row->Add(folder_, wxSizerFlags(1).CenterVertical());
  row->Add(browse, wxSizerFlags().CenterVertical().Border(wxLEFT, gap_ / 2));
  column_->Add(row, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap_ / 2));
}

void WelcomeBox::AddHeading(const char* text) {
  auto* heading = new wxStaticText(this, wxID_ANY, Label(text));
  heading->SetFont(heading->GetFont().Bold());
  column_->Add(heading, wxSizerFlags().Border(wxTOP, FromDIP(18)));
}

void WelcomeBox::UpdateControls() { start_->Enable(platform::IsFolder(Folder())); }

const Keeping& WelcomeBox::Thumbnails() const {
  size_t chosen = 0;
  while (!keepings_[chosen]->GetValue()) ++chosen;
  return kKeepings[chosen];
}

}  // namespace

std::string ShowWelcome() {
  WelcomeBox box;
  LogEvent("prompt", "welcome");
  const bool skipped = box.ShowModal() != wxID_OK;
  LogEvent("welcome", skipped ? "skipped" : "answered");
  if (skipped) return {};
  settings.DefaultThumbnailMode = box.Thumbnails().mode;
  settings.UpdateThumbnailsFlag = box.Thumbnails().offers;
  (void)StoreLanguage(box.Language());
  const std::string folder = box.Folder();
  if (folder == platform::SpecialFolderPath(platform::SpecialFolder::Pictures)) return {};
  Favorites favorites;
  favorites.Load();
  (void)favorites.Add(folder);
  return folder;
}

}  // namespace fotomill::desktop
