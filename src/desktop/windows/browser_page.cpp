#include "desktop/windows/browser_page.h"

#include <wx/bmpbuttn.h>
#include <wx/dataobj.h>
#include <wx/dnd.h>
#include <wx/filename.h>
#include <wx/simplebook.h>
#include <wx/sizer.h>
#include <wx/srchctrl.h>
#include <wx/textctrl.h>

#include <algorithm>

#include "core/choice_lists.h"
#include "core/settings.h"
#include "desktop/event_log.h"
#include "desktop/windows/bitmaps.h"
#include "desktop/windows/details_list.h"
#include "desktop/windows/folder_drop.h"
#include "desktop/windows/thumbnail_canvas.h"
#include "desktop/windows/update_bar.h"
#include "desktop/windows/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill::desktop {

namespace {

constexpr int kGatherMs = 300;  // changes of a folder are gathered for so long
constexpr size_t kMostHistory = 100;
enum View { kThumbnailView, kDetailsView };  // pages of the book, the second made when it is first shown

}  // namespace

BrowserPage::BrowserPage(wxWindow* parent, BrowserHost& host, ThumbnailService& thumbnails, const BrowserModes& modes)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE, "Browser"),
      host_(host),
      thumbnails_(thumbnails),
      reloadTimer_(this) {
  model_.SetModes(modes);
  BuildPathBar();
  views_ = new wxSimplebook(this);
  const auto selected = [this] { host_.BrowserChanged(); };
  const auto menu = [this](wxWindow& window, size_t line, const wxPoint& place) {
    host_.ShowContextMenu(window, place, line != kNoLine);
  };
  ThumbnailCanvas::Events events;
  events.selectionChanged = selected;
  events.activated = [this](size_t line) { Activate(line); };
  events.contextMenu = [this, menu](size_t line, const wxPoint& place) { menu(*canvas_, line, place); };
  events.dragBegins = [this] { BeginDrag(); };
  events.resize = [this](int steps) { ChangeSize(steps); };
  events.renamed = [this](size_t line, const std::string& name) { host_.RenameFile(model_.PathOfLine(line), name); };
  canvas_ = new ThumbnailCanvas(views_, model_, thumbnails_, events);
  views_->AddPage(canvas_, "Thumbnails");
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  auto* bar = new wxBoxSizer(wxHORIZONTAL);
  const int gap = FromDIP(4);
  const auto button = [&](const char* symbol, const char* tip, auto run) {
    auto* made = new wxBitmapButton(this, wxID_ANY, Symbol(symbol), wxDefaultPosition, wxDefaultSize, wxBORDER_NONE,
                                    wxDefaultValidator, tip);
    made->SetToolTip(tip);
    made->Bind(wxEVT_BUTTON, [run](wxCommandEvent&) { run(); });
    bar->Add(made, wxSizerFlags().CenterVertical().Border(wxLEFT, gap));
    return made;
  };
  back_ = button("back", "Back", [this] { GoBack(); });
  forward_ = button("forward", "Forward", [this] { GoForward(); });
  button("up", "Parent folder", [this] { GoUp(); });
  bar->Add(path_, wxSizerFlags(1).CenterVertical().Border(wxALL, gap));
  bar->Add(filter_, wxSizerFlags().CenterVertical().Border(wxRIGHT, gap));
  sizer->Add(bar, wxSizerFlags().Expand());
  updateBar_ = new UpdateBar(this, [this](int32_t choice) {
    if (offer_ != nullptr) offer_->Answer(choice);
    ShowUpdateBar(false);
    FocusList();
  });
  updateBar_->Hide();
  updateBar_->MoveBeforeInTabOrder(views_);
  sizer->Add(updateBar_, wxSizerFlags().Expand());
  sizer->Add(views_, wxSizerFlags(1).Expand());
  SetSizer(sizer);
  SetDropTarget(new FolderDrop([this](const wxPoint&) { return model_.Folder(); },
                               [this](const std::vector<std::string>& files, const std::string& folder, bool move) {
                                 host_.DropFiles(files, folder, move);
                               }));
  Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Reload(); });
  Bind(wxEVT_FSWATCHER, [this](wxFileSystemWatcherEvent& event) {
    constexpr int kNoChange = wxFSW_EVENT_ACCESS | wxFSW_EVENT_WARNING | wxFSW_EVENT_ERROR;
    if ((event.GetChangeType() & kNoChange) == 0 && !reloadTimer_.IsRunning()) reloadTimer_.StartOnce(kGatherMs);
  });
}

BrowserPage::~BrowserPage() {
  StopListing();
  StopOffer();
}

void BrowserPage::BuildPathBar() {
  path_ = new wxTextCtrl(this, wxID_ANY, "", wxDefaultPosition, wxDefaultSize, wxTE_PROCESS_ENTER, wxDefaultValidator, "Folder");
  path_->AutoCompleteDirectories();
  path_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) {
    std::string folder = Utf8(path_->GetValue());
    if (folder.starts_with('~')) folder.replace(0, 1, Utf8(wxGetHomeDir()));
    folder = platform::AbsolutePath(folder);
    if (!platform::IsFolder(folder)) return wxBell();
    Open(folder);
    FocusList();
  });
  const auto leave = [this](wxKeyEvent& event) {
    if (event.GetKeyCode() != WXK_ESCAPE) return event.Skip();
    path_->ChangeValue(Shown(model_.Folder()));
    if (!filter_->IsEmpty()) filter_->Clear();
    FocusList();
  };
  path_->Bind(wxEVT_KEY_DOWN, leave);
  filter_ = new wxSearchCtrl(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(200, -1)), wxTE_PROCESS_ENTER,
                             wxDefaultValidator, "Filter");
  filter_->SetDescriptiveText("Filter");
  filter_->ShowCancelButton(true);
  filter_->SetToolTip("Shows only files whose names contain this, or match its * and ?");
  filter_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { ApplyFilter(); });
  filter_->Bind(wxEVT_SEARCHCTRL_CANCEL_BTN, [this](wxCommandEvent&) { filter_->Clear(); });
  filter_->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { FocusList(); });
  filter_->Bind(wxEVT_CHAR_HOOK, leave);
}

// --- folders ---

void BrowserPage::Open(const std::string& folder, const std::string& focus, bool fromHistory) {
  const bool same = folder == model_.Folder();
  wantedFocus_ = focus;
  if (same) return Reload();
  if (!fromHistory) {
    if (!history_.empty()) history_.resize(historyPlace_ + 1);
    history_.push_back(folder);
    if (history_.size() > kMostHistory) history_.erase(history_.begin());
    historyPlace_ = history_.size() - 1;
  }
  StopOffer();
  offered_ = false;
  ShowUpdateBar(false);
  model_.SetFolder(folder);
  model_.SetModes(ModesForFolder(folder, model_.Modes()));
  filter_->ChangeValue("");
  path_->ChangeValue(Shown(folder));
  canvas_->ScrollTo(0);
  ShowView();
  StartListing();
  watcher_.reset();
  host_.BrowserChanged();
}

void BrowserPage::Reload() { StartListing(); }

void BrowserPage::GoBack() {
  if (!CanGoBack()) return;
  const std::string child(platform::FileNameOf(model_.Folder()));
  Open(history_[--historyPlace_], child, true);
}

void BrowserPage::GoForward() {
  if (CanGoForward()) Open(history_[++historyPlace_], {}, true);
}

void BrowserPage::GoUp() {
  const std::string parent = platform::AbsolutePath(platform::JoinFolder(model_.Folder(), ".."));
  if (parent != model_.Folder()) Open(parent, std::string(platform::FileNameOf(model_.Folder())));
}

void BrowserPage::StopListing() {
  if (factsJob_ != nullptr) factsJob_->stop = true;
  factsJob_.reset();
  if (job_ != nullptr) job_->stop = true;
  job_.reset();
}

// Names come first, then sizes and times, so that even a folder of 100,000 files appears at once. The thread is not waited
// for, since a folder may hang; what it finds when nobody waits any more is dropped.
void BrowserPage::StartListing() {
  StopListing();
  listing_ = true;
  job_ = std::make_shared<Job>();
  const auto tell = [this, weak = std::weak_ptr(job_)](FolderListing listing, bool complete) {
    wxTheApp->CallAfter([this, weak, listing = std::move(listing), complete]() mutable {
      if (weak.lock() != nullptr) TakeListing(std::move(listing), complete);
    });
  };
  std::thread([tell, job = job_, folder = model_.Folder(), early = model_.ItemCount() == 0] {
    FolderListing listing = ListForBrowser(folder, false, job->stop);
    if (early && !job->stop) tell(listing, false);
    AddFacts(folder, listing, job->stop);
    if (!job->stop) tell(std::move(listing), true);
  }).detach();
}

void BrowserPage::TakeListing(FolderListing listing, bool complete) {
  const size_t count = listing.items.size();
  model_.SetItems(std::move(listing.items));
  listing_ = !complete;
  LogEvent(complete ? "listed" : "names", std::to_string(count) + " " + model_.Folder());
  if (!wantedFocus_.empty()) {
    const size_t line = model_.FindLine(wantedFocus_);
    if (line != kNoLine) model_.Selected().SelectOnly(line);
  }
  if (model_.Selected().Focus() == kNoLine && model_.LineCount() > 0) model_.Selected().MoveFocus(0, false, true);
  if (ShowsDetails()) {
    details_->ModelChanged();
  } else {
    canvas_->ModelChanged();
    if (wantedScroll_ >= 0) canvas_->ScrollTo(wantedScroll_);
    if (!wantedFocus_.empty()) canvas_->ShowLine(model_.Selected().Focus());
  }
  if (complete) {
    Watch();
    StartFacts();
    OfferThumbnails();
    wantedFocus_.clear();
    wantedScroll_ = -1;
  }
  host_.BrowserChanged();
}

// Tells of changes in the folder; many at once are one. Only works once the program waits for events.
void BrowserPage::Watch() {
  if (settings.WatchFolders == 0 || watcher_ != nullptr) return;
  const wxLogNull quiet;
  watcher_ = std::make_unique<wxFileSystemWatcher>();
  watcher_->SetOwner(this);
  watcher_->Add(wxFileName::DirName(wxString::FromUTF8(model_.Folder())));
}

// --- what only the files' headers tell ---

bool BrowserPage::NeedsFacts() const {
  const BrowserModes& modes = model_.Modes();
  return modes.view == choice::kViewDetails || modes.sort == choice::kSortExifDate || modes.sort == choice::kSortDimensions;
}

void BrowserPage::StartFacts() {
  constexpr size_t kGathered = 200;
  if (listing_ || factsJob_ != nullptr || !NeedsFacts()) return;
  std::vector<std::pair<size_t, FolderItem>> wanted;
  for (size_t line = 0; line < model_.LineCount(); ++line) {
    const size_t item = model_.ItemOfLine(line);
    if (!model_.Item(item).folder && model_.Item(item).width == 0) wanted.emplace_back(item, model_.Item(item));
  }
  if (wanted.empty()) return;
  factsJob_ = std::make_shared<Job>();
  const auto tell = [this, weak = std::weak_ptr(factsJob_)](std::vector<std::pair<size_t, FolderItem>> facts, bool last) {
    wxTheApp->CallAfter([this, weak, facts = std::move(facts), last] {
      if (weak.lock() != nullptr) TakeFacts(facts, last);
    });
  };
  std::thread([tell, job = factsJob_, folder = model_.Folder(), wanted = std::move(wanted)]() mutable {
    std::vector<std::pair<size_t, FolderItem>> found;
    for (auto& [item, facts] : wanted) {
      if (job->stop) return;
      AddPictureFacts(folder, facts);
      if (facts.width > 0) found.emplace_back(item, std::move(facts));
      if (found.size() == kGathered) tell(std::exchange(found, {}), false);
    }
    tell(std::move(found), true);
  }).detach();
}

void BrowserPage::TakeFacts(const std::vector<std::pair<size_t, FolderItem>>& facts, bool last) {
  for (const auto& [item, known] : facts) model_.SetFacts(item, known);
  const int32_t sort = model_.Modes().sort;
  if (last && (sort == choice::kSortExifDate || sort == choice::kSortDimensions)) {
    model_.UpdateOrder();
    ShowView();
  } else if (ShowsDetails()) {
    details_->Refresh();
  }
  if (!last) return;
  factsJob_.reset();
  LogEvent("facts", model_.Folder());
}

// --- missing thumbnail files ---

void BrowserPage::OfferThumbnails() {
  if (offered_ || model_.ItemCount() == 0) return;
  offered_ = true;
  ThumbnailBrowser browser;
  browser.folder = model_.Folder();
  for (size_t i = 0; i < model_.ItemCount(); ++i) {
    if (!model_.Item(i).folder) browser.files.push_back(model_.Item(i).name);
  }
  browser.mode = static_cast<choice::ThumbnailMode>(model_.Modes().thumbnails);
  browser.view = static_cast<choice::ViewMode>(model_.Modes().view);
  browser.asks = asksForUpdates_;
  browser.lastCompaction = lastCompaction_;
  // What the offer tells of a folder that was left meanwhile is dropped.
  const auto weak = std::make_shared<std::weak_ptr<ThumbnailOffer>>();
  const auto post = [this, weak](std::function<void()> action) {
    wxTheApp->CallAfter([weak, action = std::move(action)] {
      if (weak->lock() != nullptr) action();
    });
  };
  ThumbnailOffer::Events events;
  events.ask = [this, post](int32_t count, int32_t selected) {
    post([this, count, selected] {
      updateBar_->Ask(count, selected);
      ShowUpdateBar(true);
      LogEvent("offer", std::to_string(count));
    });
  };
  events.building = [post, this](size_t done, size_t total) {
    post([this, done, total] {
      updateBar_->Tell(wxString::Format("Creating thumbnails: %zu of %zu", done, total));
      ShowUpdateBar(done < total);
    });
  };
  events.ended = [post, this](bool changed, const ThumbnailBrowser& after) {
    post([this, changed, asks = after.asks, compaction = after.lastCompaction] {
      asksForUpdates_ = asks;
      lastCompaction_ = compaction;
      ShowUpdateBar(false);
      if (changed) canvas_->WantThumbnails();
      LogEvent("offer-ended", changed ? "changed" : "unchanged");
    });
  };
  offer_ = ThumbnailOffer::Start(std::move(browser), std::move(events));
  *weak = offer_;
}

void BrowserPage::StopOffer() {
  if (offer_ != nullptr) offer_->Stop();
  offer_.reset();
}

void BrowserPage::ShowUpdateBar(bool show) {
  if (updateBar_->IsShown() == show) return;
  updateBar_->Show(show);
  Layout();
}

// --- what is shown how ---

bool BrowserPage::ShowsDetails() const { return views_->GetSelection() == kDetailsView; }

void BrowserPage::ShowView() {
  const bool details = model_.Modes().view == choice::kViewDetails;
  if (details && details_ == nullptr) {
    DetailsList::Events events;
    events.selectionChanged = [this] { host_.BrowserChanged(); };
    events.activated = [this](size_t line) { Activate(line); };
    events.contextMenu = [this](size_t line, const wxPoint& place) { host_.ShowContextMenu(*details_, place, line != kNoLine); };
    events.sort = [this](int32_t sort) { SetSort(sort, model_.Modes().sort == sort && !model_.Descending()); };
    details_ = new DetailsList(views_, model_, events);
    views_->AddPage(details_, "Details");
  }
  const bool hadFocus = canvas_->HasFocus() || (details_ != nullptr && details_->HasFocus());
  views_->SetSelection(details ? kDetailsView : kThumbnailView);
  if (details) {
    details_->ModelChanged();
  } else {
    canvas_->ModelChanged();
    canvas_->ShowLine(model_.Selected().Focus());
  }
  if (hadFocus) FocusList();
  StartFacts();
}

void BrowserPage::SetModes(const BrowserModes& modes) {
  model_.SetModes(modes);
  ShowView();
  host_.BrowserChanged();
}

void BrowserPage::SetViewMode(int32_t view) {
  BrowserModes modes = model_.Modes();
  modes.view = view;
  SetModes(modes);
}

void BrowserPage::SetThumbnailMode(int32_t mode) {
  BrowserModes modes = model_.Modes();
  modes.thumbnails = mode;
  SetModes(modes);
}

void BrowserPage::SetSort(int32_t sort, bool descending) {
  model_.SetSort(sort, descending);
  ShowView();
  host_.BrowserChanged();
}

void BrowserPage::ChangeSize(int steps) {
  const int32_t view = std::clamp(model_.Modes().view + steps, choice::kViewList + 0, choice::kViewLarge + 0);
  if (view != model_.Modes().view) SetViewMode(view);
}

void BrowserPage::SelectionChanged() {
  if (ShowsDetails()) {
    details_->ShowSelection();
  } else {
    canvas_->ShowLine(model_.Selected().Focus());
    canvas_->Refresh();
  }
  host_.BrowserChanged();
}

void BrowserPage::FocusName(const std::string& name) {
  const size_t line = model_.FindLine(name);
  if (line == kNoLine) return;
  model_.Selected().SelectOnly(line);
  SelectionChanged();
}

void BrowserPage::EditFocusedName() {
  const size_t focus = model_.Selected().Focus();
  if (focus == kNoLine) return;
  if (!ShowsDetails()) return canvas_->EditName(focus);
  wxTextEntryDialog dialog(this, "New name:", "Rename", Shown(model_.Line(focus).name));
  if (dialog.ShowModal() == wxID_OK) host_.RenameFile(model_.PathOfLine(focus), Utf8(dialog.GetValue()));
}

void BrowserPage::EditPath() {
  path_->SetFocus();
  path_->SelectAll();
}

void BrowserPage::EditFilter() { filter_->SetFocus(); }

void BrowserPage::ApplyFilter() {
  model_.SetFilter(Utf8(filter_->GetValue()));
  if (ShowsDetails()) {
    details_->ModelChanged();
  } else {
    canvas_->ModelChanged();
  }
  host_.BrowserChanged();
}

void BrowserPage::Activated() {
  thumbnails_.SetListener([this](const std::vector<ThumbnailLoader::Result>& results) { ThumbnailsCame(results); });
  canvas_->WantThumbnails();
}

void BrowserPage::ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results) {
  canvas_->ThumbnailsCame(results);
  if (EventLogOn()) host_.BrowserChanged();
}

void BrowserPage::FocusList() {
  if (ShowsDetails()) {
    details_->SetFocus();
  } else {
    canvas_->SetFocus();
  }
}

size_t BrowserPage::MissingThumbnails() const { return ShowsDetails() ? 0 : canvas_->MissingThumbnails(); }
int64_t BrowserPage::Scroll() const { return canvas_->Scroll(); }

void BrowserPage::Activate(size_t line) {
  const FolderItem& item = model_.Line(line);
  const std::string path = model_.PathOfLine(line);
  if (item.folder) return Open(path);
  host_.ViewFile(path);
}

void BrowserPage::BeginDrag() {
  wxFileDataObject files;
  for (const std::string& file : model_.FilesForFunction()) files.AddFile(wxString::FromUTF8(file));
  if (files.GetFilenames().empty()) return;
  wxDropSource source(files, this);
  if (source.DoDragDrop(wxDrag_AllowMove) == wxDragMove) Reload();
}

}  // namespace fotomill::desktop
