#include "desktop/windows/search/search_window.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/combobox.h>
#include <wx/dialog.h>
#include <wx/dirdlg.h>
#include <wx/frame.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/weakref.h>

#include <string>
#include <vector>

#include "catalog/search/picture_index.h"
#include "core/choice_lists.h"
#include "core/data_folder.h"
#include "desktop/models/search/folder_search.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/dialogs/help.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/loose_work.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "processing/faces/face_finder.h"
#include "settings/configuration.h"
#include "settings/search_options.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"

namespace fotomill::desktop {

namespace {

constexpr int kMostStars = 5;

// A text to search for that can be switched off.
struct MatchField {
  const char* label;
  SettingFlag Settings::*on;
  SettingText Settings::*text;
  const char* tip;
};
const MatchField kFields[] = {
    {TrLater("&Keywords"), &Settings::PictureKeywordMatch, &Settings::PictureSearchKeywordField,
     TrLater("Keywords or patterns (*, ?), separated by commas")},
    {TrLater("&Comment"), &Settings::PictureCommentMatch, &Settings::PictureSearchCommentField,
     TrLater("Part of title, description or comment")},
    {TrLater("Any &text"), &Settings::PictureStringMatch, &Settings::PictureSearchMatchField,
     TrLater("Part of the name or of any text: title, keyword, camera, place, ...")},
};

class SearchWindow : public wxDialog {
 public:
  explicit SearchWindow(Shell& shell);
  ~SearchWindow() override;

 private:
  void AddFolderRow(wxFlexGridSizer& grid);
  void OfferFolders(const std::string& folder);
  void AddFields(wxFlexGridSizer& grid);
  void AddRanges(wxFlexGridSizer& grid);
  wxSizer* Options();
  wxSizer* Buttons();
  void UpdateControls();
  void StoreControls();
  bool ReadCriteria(SearchCriteria& criteria);
  void Begin();
  void Take(const SearchNews& news);
  void End(bool stopped);
  void ShowResults(bool last);

  Shell& shell_;
  LooseWork work_;
  std::string folder_;  // being searched
  std::vector<std::string> found_, problems_;
  uint64_t examined_ = 0;
  wxWeakRef<BrowserPage> page_;  // with the results of this search

  wxComboBox* place_ = nullptr;
  wxTextCtrl* name_ = nullptr;
  wxCheckBox* checks_[std::size(kFields)] = {};
  wxTextCtrl* texts_[std::size(kFields)] = {};
  wxChoice* rating_ = nullptr;
  wxTextCtrl* taken_ = nullptr;
  wxCheckBox* faces_ = nullptr;  // null if the face detector is not installed
  wxCheckBox* damaged_ = nullptr;
  wxChoice* mode_ = nullptr;
  wxCheckBox* remember_ = nullptr;
  wxCheckBox* select_ = nullptr;
  wxCheckBox* replace_ = nullptr;
  wxStaticText* status_ = nullptr;
  wxButton* search_ = nullptr;
  wxButton* close_ = nullptr;
};

wxWeakRef<SearchWindow> shownWindow;

SearchWindow::SearchWindow(Shell& shell)
    : wxDialog(&shell.Window(), wxID_ANY, Label("Find pictures"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "PictureSearchBox"),
      shell_(shell) {
  const int gap = FromDIP(8);
  auto* grid = new wxFlexGridSizer(2, gap, gap);
  grid->AddGrowableCol(1);
  AddFolderRow(*grid);
  AddFields(*grid);
  AddRanges(*grid);
  status_ = new wxStaticText(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize,
                             wxST_NO_AUTORESIZE | wxST_ELLIPSIZE_MIDDLE);
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(grid, wxSizerFlags().Expand().Border(wxALL, gap));
  column->Add(Options(), wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, gap));
  column->AddStretchSpacer();
  column->Add(status_, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  column->Add(Buttons(), wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizerAndFit(column);
  SetMinSize(GetSize());
  const wxSize kept(settings.PictureSearchDialogWide, settings.PictureSearchDialogDeep);
  SetSize(wxSize(std::max(kept.x, GetSize().x), std::max(kept.y, GetSize().y)));
  CentreOnParent();
  Bind(
      wxEVT_BUTTON, [this](wxCommandEvent&) { Begin(); }, wxID_OK);
  Bind(
      wxEVT_BUTTON,
      [this](wxCommandEvent&) {
        if (work_.Started()) return End(true);
        Destroy();
      },
      wxID_CANCEL);
  Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent&) {
    if (work_.Started()) End(true);
    Destroy();
  });
  UpdateControls();
  name_->SetFocus();
  name_->SelectAll();
}

SearchWindow::~SearchWindow() {
  settings.PictureSearchDialogWide = GetSize().x;
  settings.PictureSearchDialogDeep = GetSize().y;
  (void)SaveConfiguration();
}

void SearchWindow::AddFolderRow(wxFlexGridSizer& grid) {
  const std::string folder = SearchFolderFromSettings(shell_.Tabs().CurrentFolder());
  grid.Add(new wxStaticText(this, wxID_ANY, Label("F&older:")), wxSizerFlags().CenterVertical());
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  place_ =
      new wxComboBox(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(340, -1)));
  place_->SetName(Label("Folder"));
  OfferFolders(folder);
  place_->AutoCompleteDirectories();
  row->Add(place_, wxSizerFlags(1).CenterVertical());
  auto* browse = new wxButton(this, wxID_ANY, Label("&Browse..."));
  browse->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
    wxDirDialog dialog(this, Label("Folder to search"), place_->GetValue(),
                       wxDD_DEFAULT_STYLE | wxDD_DIR_MUST_EXIST);
    if (dialog.ShowModal() == wxID_OK) place_->SetValue(dialog.GetPath());
  });
  row->Add(browse, wxSizerFlags().CenterVertical().Border(wxLEFT, FromDIP(6)));
  grid.Add(row, wxSizerFlags().Expand());
}

void SearchWindow::OfferFolders(const std::string& folder) {
  place_->Clear();
  for (const std::string& offered : OfferedSearchFolders())
    place_->Append(wxString::FromUTF8(offered));
  place_->SetValue(wxString::FromUTF8(folder));
}

void SearchWindow::AddFields(wxFlexGridSizer& grid) {
  const auto text = [&](const wxString& name, const std::string& value, const char* tip) {
    auto* control = new wxTextCtrl(this, wxID_ANY, Shown(value));
    control->SetName(name);
    control->SetToolTip(Label(tip));
    return control;
  };
  grid.Add(new wxStaticText(this, wxID_ANY, Label("File &name:")), wxSizerFlags().CenterVertical());
  name_ = text(Label("File name"), std::string(settings.PictureSearchWildcardField),
               TrLater("Part of the file name, or a pattern with * and ?"));
  grid.Add(name_, wxSizerFlags().Expand());
  for (size_t i = 0; i < std::size(kFields); ++i) {
    checks_[i] = new wxCheckBox(this, wxID_ANY, Label(kFields[i].label));
    checks_[i]->SetValue(settings.*kFields[i].on != 0);
    checks_[i]->Bind(wxEVT_CHECKBOX, [this, i](wxCommandEvent&) {
      UpdateControls();
      if (checks_[i]->GetValue()) texts_[i]->SetFocus();
    });
    grid.Add(checks_[i], wxSizerFlags().CenterVertical());
    texts_[i] =
        text(checks_[i]->GetLabelText(), std::string(settings.*kFields[i].text), kFields[i].tip);
    grid.Add(texts_[i], wxSizerFlags().Expand());
  }
}

void SearchWindow::AddRanges(wxFlexGridSizer& grid) {
  const auto label = [&](const wxString& name) {
    grid.Add(new wxStaticText(this, wxID_ANY, name), wxSizerFlags().CenterVertical());
  };
  label(Label("&Rating:"));
  rating_ = new wxChoice(this, wxID_ANY);
  rating_->SetName(Label("Rating"));
  rating_->Append(Label("Any"));
  for (int stars = 1; stars <= kMostStars; ++stars)
    rating_->Append(
        LabelCount("At least %1 star", "At least %1 stars", static_cast<uint64_t>(stars)));
  rating_->SetSelection(0);
  grid.Add(rating_);
  label(Label("Tak&en:"));
  taken_ = new wxTextCtrl(this, wxID_ANY, "");
  taken_->SetName(Label("Taken"));
  taken_->SetHint("2024-05..2024-07");
  taken_->SetToolTip(Label("When taken: 2024, 2024-05..2024-07-15, 2025-01-01.."));
  grid.Add(taken_, wxSizerFlags().Expand());
  label(Label("Find:"));
  mode_ = new wxChoice(this, wxID_ANY);
  mode_->SetName(Label("Criteria"));
  mode_->Append(Label("Pictures that meet all criteria"));
  mode_->Append(Label("Pictures that meet any of the criteria"));
  mode_->SetSelection(settings.PictureSearchMode == 1 ? 1 : 0);
  grid.Add(mode_);
}

wxSizer* SearchWindow::Options() {
  auto* options = new wxFlexGridSizer(2, FromDIP(4), FromDIP(16));
  const auto box = [&](const char* label, bool on) {
    auto* check = new wxCheckBox(this, wxID_ANY, Label(label));
    check->SetValue(on);
    options->Add(check);
    return check;
  };
  if (CanFindFaces(FactsOptionsFromSettings().faces))
    faces_ = box(TrLater("With &faces"), settings.PictureFaceDetectMatch != 0);
  remember_ = box(TrLater("Re&member the folder"), settings.PictureSearchPreservePath != 0);
  damaged_ = box(TrLater("&Damaged files only"), false);
  replace_ = box(TrLater("Re&place the last results"), settings.PictureSearchClearList != 0);
  select_ = box(TrLater("Se&lect the pictures found"), settings.PictureSearchTagAfterSearch != 0);
  return options;
}

wxSizer* SearchWindow::Buttons() {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  auto* help = new wxButton(this, wxID_HELP);
  help->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ShowHelp(*this, "SEARCH"); });
  row->Add(help);
  row->AddStretchSpacer();
  close_ = new wxButton(this, wxID_CANCEL, Label("Close"));
  search_ = new wxButton(this, wxID_OK, Label("&Search"));
  row->Add(close_, wxSizerFlags().Border(wxRIGHT, FromDIP(6)));
  row->Add(search_);
  search_->SetDefault();
  return row;
}

void SearchWindow::UpdateControls() {
  for (size_t i = 0; i < std::size(kFields); ++i) texts_[i]->Enable(checks_[i]->GetValue());
  search_->Enable(!work_.Started());
  close_->SetLabel(work_.Started() ? Label("Stop") : Label("Close"));
}

void SearchWindow::StoreControls() {
  const std::string folder = platform::AbsolutePath(Utf8(place_->GetValue()));
  if (platform::IsFolder(folder)) {
    (void)RememberSearchFolder(folder);
    OfferFolders(folder);
  }
  settings.PictureSearchWildcardField.AssignCut(Utf8(name_->GetValue()));
  for (size_t i = 0; i < std::size(kFields); ++i) {
    settings.*kFields[i].on = checks_[i]->GetValue() ? 1 : 0;
    (settings.*kFields[i].text).AssignCut(Utf8(texts_[i]->GetValue()));
  }
  if (faces_ != nullptr) settings.PictureFaceDetectMatch = faces_->GetValue() ? 1 : 0;
  settings.PictureSearchMode = mode_->GetSelection();
  settings.PictureSearchPreservePath = remember_->GetValue() ? 1 : 0;
  settings.PictureSearchClearList = replace_->GetValue() ? 1 : 0;
  settings.PictureSearchTagAfterSearch = select_->GetValue() ? 1 : 0;
  (void)SaveConfiguration();
}

// False after showing what is wrong.
bool SearchWindow::ReadCriteria(SearchCriteria& criteria) {
  criteria = SearchCriteriaFromSettings();
  criteria.faces = faces_ != nullptr && faces_->GetValue();
  criteria.damaged = damaged_->GetValue();
  if (rating_->GetSelection() > 0)
    criteria.rating = NumberRange{rating_->GetSelection(), kMostStars};
  if (const std::string text = Utf8(taken_->GetValue()); !text.empty()) {
    criteria.taken = ParseDateRange(text);
    if (!criteria.taken) {
      status_->SetLabel(
          Label("%1: \"%2\" is not a range like %3.", Label("Taken"), text, "2024-05..2024-07"));
      taken_->SetFocus();
      return false;
    }
  }
  return true;
}

void SearchWindow::Begin() {
  if (work_.Started()) return;
  StoreControls();
  SearchCriteria criteria;
  if (!ReadCriteria(criteria)) return;
  page_ = nullptr;
  folder_ = platform::AbsolutePath(Utf8(place_->GetValue()));
  found_.clear();
  problems_.clear();
  examined_ = 0;
  status_->SetLabel(Label("Searching..."));
  FolderSearch search{.folder = folder_,
                      .criteria = std::move(criteria),
                      .facts = FactsOptionsFromSettings(),
                      .index = DataFile(kPictureIndexName)};
  work_.Start(
      [this, search](const StopToken& stop, const LooseWork::Report& report) {
        RunFolderSearch(search, stop,
                        [&](const SearchNews& news) { report([this, news] { Take(news); }); });
        report([this] { End(false); });
      },
      [this] { End(true); });
  UpdateControls();
  LogEvent("search", "begun");
}

void SearchWindow::Take(const SearchNews& news) {
  examined_ += news.examined;
  found_.insert(found_.end(), news.found.begin(), news.found.end());
  problems_.insert(problems_.end(), news.problems.begin(), news.problems.end());
  status_->SetLabel(wxString::FromUTF8(Tr("%1 found, %2 searched", ThousandsText(found_.size()),
                                          TrGroupedCount("%1 file", "%1 files", examined_))));
  if (settings.SearchWindowNoRedraw == 0 && !news.found.empty()) ShowResults(false);
}

// What was found so far is shown even if the search was stopped.
void SearchWindow::End(bool stopped) {
  work_.Stop();
  std::string text = Tr("%1 found, %2 searched", ThousandsText(found_.size()),
                        TrGroupedCount("%1 file", "%1 files", examined_));
  if (stopped) text += ". " + std::string(Tr("The search was stopped."));
  if (!problems_.empty())
    text += ". " + TrCount("%1 could not be read.", "%1 could not be read.", problems_.size());
  status_->SetLabel(wxString::FromUTF8(text));
  std::string all;
  for (size_t i = 0; i < std::min<size_t>(problems_.size(), 20); ++i) all += problems_[i] + "\n";
  status_->SetToolTip(Shown(all));
  UpdateControls();
  if (!found_.empty()) ShowResults(true);
  if (settings.FindBeep != 0) wxBell();
  LogEvent("search", "found=" + std::to_string(found_.size()) +
                         " examined=" + std::to_string(examined_) + (stopped ? " stopped" : ""));
}

void SearchWindow::ShowResults(bool last) {
  const FolderView view{{settings.PictureSearchVirtualThumbnails != 0
                             ? choice::kVirtual
                             : settings.DefaultThumbnailMode,
                         settings.PictureSearchViewMode, settings.PictureSearchSortMode}};
  BrowserPage* page = page_;
  if (page == nullptr && replace_->GetValue()) page = shell_.Tabs().FoundPage();
  page_ = page = shell_.Tabs().ShowFound(folder_, found_, view, page);
  if (last && select_->GetValue()) page->SelectWhenListed(found_);
}

}  // namespace

void ShowSearch(Shell& shell) {
  if (!shownWindow) shownWindow = new SearchWindow(shell);
  shownWindow->Show();
  shownWindow->Raise();
  LogEvent("prompt", "search");
}

}  // namespace fotomill::desktop
