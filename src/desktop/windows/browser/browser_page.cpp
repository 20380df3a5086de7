#include "desktop/windows/browser/browser_page.h"

#include <wx/dataobj.h>
#include <wx/dnd.h>
#include <wx/simplebook.h>
#include <wx/sizer.h>
#include <wx/textdlg.h>

#include <algorithm>
#include <unordered_set>
#include <utility>

#include "core/choice_lists.h"
#include "desktop/models/browser/missing_facts.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/browser_bar.h"
#include "desktop/windows/browser/details_list.h"
#include "desktop/windows/browser/folder_note.h"
#include "desktop/windows/browser/folder_problem.h"
#include "desktop/windows/browser/thumbnail_canvas.h"
#include "desktop/windows/browser/update_bar.h"
#include "desktop/windows/files/file_list_data.h"
#include "desktop/windows/files/folder_drop.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr BrowserModes kNoModes{-1, -1, -1};
constexpr int kPatienceMs = 1000;  // until the page says that it waits for a folder

BrowserModes Chosen(const BrowserModes& chosen, const BrowserModes& otherwise) {
  const auto either = [](int32_t mode, int32_t other) { return mode >= 0 ? mode : other; };
  return {either(chosen.thumbnails, otherwise.thumbnails), either(chosen.view, otherwise.view),
          either(chosen.sort, otherwise.sort)};
}

DateGrouping GroupingFromSettings() {
  const int32_t last = static_cast<int32_t>(DateGrouping::Year);
  return static_cast<DateGrouping>(std::clamp(settings.BrowserGrouping, 0, last));
}

}  // namespace

BrowserPage::BrowserPage(wxWindow* parent, BrowserHost& host, ThumbnailService& thumbnails,
                         const FolderView& view)
    : wxPanel(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxTAB_TRAVERSAL | wxBORDER_NONE,
              "Browser"),
      host_(host),
      thumbnails_(thumbnails),
      base_(view),
      reader_({[this](FolderListing listing, bool complete) {
                 ShowListing(std::move(listing), complete);
               },
               [this](const PlacedItems& found, bool last) { ShowFacts(found, last); },
               [this](const PlacedItems& found, bool last) { ShowTags(found, last); }}),
      watch_(wxFSW_EVENT_ALL & ~(wxFSW_EVENT_ACCESS | wxFSW_EVENT_WARNING | wxFSW_EVENT_ERROR),
             [this](const std::vector<std::string>&) { Reload(); }),
      offer_(this, {[this] { FocusList(); }, [this] { canvas_->WantThumbnails(); }}) {
  model_.SetView(view);
  model_.SetGrouping(GroupingFromSettings());
  bar_ = new BrowserBar(this, model_, trail_,
                        {[this](int steps) { StepAlongTrail(steps); }, [this] { GoUp(); },
                         [this](const std::string& folder) {
                           Open(folder);
                           FocusList();
                         },
                         [this](int32_t mode, bool descending) { SetSort(mode, descending); },
                         [this](int32_t side) { SetSide(side); },
                         [this] {
                           ShowLines();
                           host_.BrowserChanged();
                         },
                         [this] { FocusList(); }});
  BuildViews();
  problem_ = new FolderProblem(this, [this] { GoUp(); });
  late_.Bind(wxEVT_TIMER,
             [this](wxTimerEvent&) { ShowProblem(Tr("Waiting for %1...", model_.Folder())); });
  auto* sizer = new wxBoxSizer(wxVERTICAL);
  sizer->Add(bar_, wxSizerFlags().Expand());
  note_ = new FolderNote(this);
  sizer->Add(note_, wxSizerFlags().Expand());
  offer_.Bar()->MoveBeforeInTabOrder(views_);
  sizer->Add(offer_.Bar(), wxSizerFlags().Expand());
  sizer->Add(problem_, wxSizerFlags(1).Expand());
  sizer->Add(views_, wxSizerFlags(1).Expand());
  SetSizer(sizer);
  // the details take keys for themselves
  Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    const bool digit = !event.HasAnyModifiers() && details_ != nullptr && details_->HasFocus();
    if (!digit || !TagByKey(event.GetKeyCode())) event.Skip();
  });
  SetDropTarget(
      new FolderDrop([this](const wxPoint& place) { return FolderAt(place); },
                     [this](const std::vector<std::string>& files, const std::string& folder,
                            bool move) { host_.DropFiles(files, folder, move); }));
}

void BrowserPage::BuildViews() {
  views_ = new wxSimplebook(this);
  ThumbnailCanvas::Events events;
  events.selectionChanged = [this] { host_.BrowserChanged(); };
  events.activated = [this](size_t line) { Activate(line); };
  events.contextMenu = [this](size_t line, const wxPoint& place) {
    host_.ShowContextMenu(*canvas_, place, line != kNoLine);
  };
  events.dragBegins = [this] { BeginDrag(); };
  events.resize = [this](int steps) { ChangeSize(steps); };
  events.renamed = [this](size_t line, const std::string& name) {
    host_.RenameFile(model_.PathOfLine(line), name);
  };
  events.digit = [this](int key) { return TagByKey(key); };
  canvas_ = new ThumbnailCanvas(views_, model_, thumbnails_, events);
  views_->AddPage(canvas_, Label("Thumbnails"));
}

// --- folders ---

void BrowserPage::Open(const std::string& folder, const std::string& focus) {
  if (folder != model_.Folder()) trail_.Go(folder);
  ShowFolder(folder, focus);
}

void BrowserPage::ShowFound(const std::string& folder, const std::vector<std::string>& names,
                            const FolderView& view) {
  if (!found_ || folder != model_.Folder()) {
    if (folder != model_.Folder()) trail_.Go(folder);
    EnterFolder(folder);
    model_.SetView(view);
    ShowEntered();
  }
  subfolders_ = false;
  found_ = names;
  Reload();
  host_.BrowserChanged();
}

void BrowserPage::FollowRename(const std::string& from, const std::string& to) {
  if (!found_) return;
  const std::string start = platform::JoinFolder(model_.Folder(), "");
  for (std::string& name : *found_) {
    if (start + name == from && to.starts_with(start)) name = to.substr(start.size());
  }
}

void BrowserPage::StepAlongTrail(int steps) {
  if (!trail_.CanStep(steps)) return;
  const std::string left(platform::FileNameOf(model_.Folder()));
  ShowFolder(trail_.Step(steps), steps < 0 ? left : std::string());
}

void BrowserPage::GoUp() {
  const std::string parent = platform::AbsolutePath(platform::JoinFolder(model_.Folder(), ".."));
  if (parent != model_.Folder()) Open(parent, std::string(platform::FileNameOf(model_.Folder())));
}

void BrowserPage::ShowFolder(const std::string& folder, const std::string& focus) {
  wantedFocus_ = focus;
  closesIfMissing_ = false;
  const bool hadFound = std::exchange(found_, {}).has_value();
  if (folder == model_.Folder() && !hadFound) return Reload();
  wantedNames_.reset();
  subfolders_ = false;
  EnterFolder(folder);
  UseView(kNoModes);
  ShowEntered();
  Reload();
  host_.BrowserChanged();
}

// Empties the browser for another folder, whose view is set next.
void BrowserPage::EnterFolder(const std::string& folder) {
  watch_.UnwatchAll();
  offer_.Forget();
  model_.SetFolder(folder);
  bar_->ShowFolder(folder);
  note_->ShowText(Shown(host_.NoteAbout(folder)));
}

void BrowserPage::ShowEntered() {
  canvas_->ScrollTo(0);
  ShowProblem({});
  ShowView();
}

// The last view chosen for the folder, else the default one; modes `chosen` by the folder itself
// take precedence and persist.
void BrowserPage::UseView(const BrowserModes& chosen) {
  override_ = chosen;
  const FolderView kept = host_.Views().Find(model_.Folder(), base_);
  FolderView view = kept;
  view.modes = Chosen(chosen, kept.modes);
  if (view != kept) base_ = view;
  model_.SetView(view);
}

void BrowserPage::Reload() {
  watch_.ReadingBegan();
  if (found_) return reader_.ListFound(model_.Folder(), *found_);
  reader_.List(model_.Folder(), model_.ItemCount() == 0, subfolders_);
  late_.StartOnce(kPatienceMs);
}

void BrowserPage::ShowListing(FolderListing listing, bool complete) {
  late_.Stop();
  const size_t count = listing.items.size();
  const FolderState state = listing.state;
  if (std::exchange(closesIfMissing_, false) && state == FolderState::Missing)
    return host_.CloseBrowser(*this);
  ShowProblem(listing.problem);
  // The user's choices apply until the folder's own settings change.
  const bool otherView = !found_ && state == FolderState::Listed && listing.chosen != override_;
  if (otherView) UseView(listing.chosen);
  const bool first = model_.LineCount() == 0;
  model_.SetItems(std::move(listing.items));
  LogEvent(complete ? "listed" : "names", std::to_string(count) + " " + model_.Folder());
  ShowWanted(first);
  if (complete) {
    if (!found_) watch_.Watch(model_.Folder());
    factsRead_ = false;
    StartFacts();
    StartTags();
    const bool offers = !found_ && !subfolders_ && !note_->IsShown();
    if (offers && state == FolderState::Listed) OfferThumbnails();
    wantedFocus_.clear();
    wantedScroll_ = -1;
    wantedNames_.reset();
  }
  if (otherView) ShowView();
  host_.BrowserChanged();
  if (complete) watch_.ReadingEnded();
}

// Shows the new lines, with the selection, focus and place waited for. `first`: there were none
// before. Later listings leave it alone that no file has the focus: Delete would take it.
void BrowserPage::ShowWanted(bool first) {
  Selection& selected = model_.Selected();
  if (wantedNames_) {
    model_.SelectNames(*wantedNames_);
  } else {
    const size_t line = wantedFocus_.empty() ? kNoLine : model_.FindLine(wantedFocus_);
    if (line != kNoLine) selected.SelectOnly(line);
    if (first && selected.Focus() == kNoLine && model_.LineCount() > 0)
      selected.MoveFocus(0, false, true);
  }
  ShowLines();
  const bool placed = wantedNames_ || !wantedFocus_.empty() || wantedScroll_ >= 0;
  if (placed && !ShowsDetails()) canvas_->RestorePlace(wantedScroll_, selected.Focus());
}

// Shows why the folder cannot be listed instead of its files; empty: its files.
void BrowserPage::ShowProblem(const std::string& problem) {
  const bool shown = !problem.empty();
  if (shown) LogEvent("folder-problem", problem);
  const bool hadFocus = shown ? canvas_->HasFocus() : problem_->HasButtonFocus();
  problem_->ShowText(Shown(problem));
  if (problem_->IsShown() == shown) return;
  problem_->Show(shown);
  views_->Show(!shown);
  Layout();
  if (hadFocus) FocusList();
}

void BrowserPage::OfferThumbnails() {
  std::vector<std::string> files;
  for (size_t i = 0; i < model_.ItemCount(); ++i) {
    if (!model_.Item(i).folder) files.push_back(model_.Item(i).name);
  }
  offer_.Offer(model_.Folder(), std::move(files), model_.Modes());
}

// --- facts that need the files' headers ---

void BrowserPage::StartFacts() {
  if (factsRead_ || Listing() || reader_.ReadingFacts() || !NeedsPictureFacts(model_)) return;
  PlacedItems wanted = ItemsWithoutPictureFacts(model_);
  if (!wanted.empty()) reader_.ReadFacts(model_.Folder(), std::move(wanted));
}

void BrowserPage::ShowFacts(const PlacedItems& found, bool last) {
  for (const auto& [item, known] : found) model_.SetFacts(item, known);
  factsRead_ = last;  // files that cannot be read have none
  if (last && OrderNeedsPictureFacts(model_)) {
    model_.UpdateOrder();
    ShowView();
  } else if (ShowsDetails()) {
    details_->Refresh();
  }
  if (last) LogEvent("facts", model_.Folder());
}

// --- ratings and labels ---

void BrowserPage::StartTags() {
  if (Listing()) return;
  PlacedItems wanted = ItemsWithoutTags(model_);
  if (!wanted.empty()) reader_.ReadTags(model_.Folder(), std::move(wanted));
}

void BrowserPage::ShowTags(const PlacedItems& found, bool last) {
  for (const auto& [item, tags] : found) model_.SetTags(item, tags);
  if (model_.TagsShown() != TagFilter::All) {
    model_.UpdateOrder();
    ShowLines();
    host_.BrowserChanged();
  } else if (ShowsDetails()) {
    details_->Refresh();
  } else {
    canvas_->Refresh();
  }
  if (!last) return;
  size_t rated = 0;
  for (size_t i = 0; i < model_.ItemCount(); ++i) rated += model_.Item(i).rating > 0;
  LogEvent("tags", "rated=" + std::to_string(rated) + " " + model_.Folder());
}

bool BrowserPage::TagByKey(int key) {
  const size_t focus = model_.Selected().Focus();
  const auto changes =
      ChangesOfKey(key, focus == kNoLine ? std::string() : model_.Line(focus).label);
  if (changes) host_.TagSelected(*changes);
  return changes.has_value();
}

void BrowserPage::TagsChanged(const std::vector<std::string>& paths) {
  model_.ForgetTags(paths);
  StartTags();
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

void BrowserPage::ShowInList(const std::string& name) {
  const size_t line = model_.FindLine(name);
  if (line != kNoLine && !ShowsDetails()) canvas_->ShowLine(line);
}

void BrowserPage::SelectWhenListed(std::vector<std::string> names) {
  if (found_) {
    const std::unordered_set<std::string> found(found_->begin(), found_->end());
    std::erase_if(names, [&found](const std::string& name) { return !found.contains(name); });
    if (names.empty()) return;
  }
  wantedNames_ = std::move(names);
  model_.SelectNames({});
  SelectionChanged();
}

void BrowserPage::FocusPath(const std::string& path) {
  const size_t line = model_.LineOfPath(path);
  if (line == kNoLine) return;
  model_.Selected().SelectOnly(line);
  SelectionChanged();
}

void BrowserPage::EditFocusedName() {
  const size_t focus = model_.Selected().Focus();
  if (focus == kNoLine) return;
  if (!ShowsDetails()) return canvas_->EditName(focus);
  wxTextEntryDialog dialog(this, Label("New name:"), Label("Rename"),
                           Shown(ShownName(model_.Line(focus))));
  if (dialog.ShowModal() == wxID_OK)
    host_.RenameFile(model_.PathOfLine(focus), Utf8(dialog.GetValue()));
}

void BrowserPage::EditPath() { bar_->EditPath(); }
void BrowserPage::OfferTrail() { bar_->OfferTrail(); }
void BrowserPage::EditFilter() { bar_->EditFilter(); }

void BrowserPage::ChooseColumns() {
  if (!ShowsDetails()) SetViewMode(choice::kViewDetails);
  details_->ChooseColumns();
}

void BrowserPage::KeepColumns() {
  if (details_ != nullptr) details_->KeepColumns();
}

void BrowserPage::Activated() {
  if (model_.Grouping() != GroupingFromSettings()) {
    model_.SetGrouping(GroupingFromSettings());
    ShowView();
  }
  thumbnails_.SetListener(
      [this](const std::vector<ThumbnailLoader::Result>& results) { ThumbnailsCame(results); });
  if (ShowsDetails()) {
    details_->WantThumbnails();
  } else {
    canvas_->ModelChanged();  // the size may have changed in another browser
  }
  if (details_ != nullptr) details_->ShowColumns();
}

void BrowserPage::ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results) {
  if (ShowsDetails()) {
    details_->ThumbnailsCame(results);
  } else {
    canvas_->ThumbnailsCame(results);
  }
  if (EventLogOn()) host_.BrowserChanged();
}

void BrowserPage::FocusList() {
  if (problem_->IsShown()) {
    problem_->FocusButton();
  } else if (ShowsDetails()) {
    details_->SetFocus();
  } else {
    canvas_->SetFocus();
  }
}

size_t BrowserPage::MissingThumbnails() const {
  return ShowsDetails() ? 0 : canvas_->MissingThumbnails();
}
int64_t BrowserPage::Scroll() const { return canvas_->Scroll(); }
bool BrowserPage::FocusInSight() const {
  return ShowsDetails() || canvas_->InSight(model_.Selected().Focus());
}

void BrowserPage::Activate(size_t line) {
  const FolderItem& item = model_.Line(line);
  const std::string path = model_.PathOfLine(line);
  if (item.folder) return Open(path);
  host_.ViewFile(path);
}

// A folder in the list, else the folder of the list.
std::string BrowserPage::FolderAt(const wxPoint& place) const {
  if (ShowsDetails() || !canvas_->IsShownOnScreen()) return model_.Folder();
  const size_t line = canvas_->LineAt(canvas_->ScreenToClient(ClientToScreen(place)));
  return line != kNoLine && model_.Line(line).folder ? model_.PathOfLine(line) : model_.Folder();
}

DraggedFiles BrowserPage::FilesToDrag() const {
  // unpacked files must stay for the others that use them
  DraggedFiles dragged{model_.PathsForFunction(), host_.NoteAbout(model_.Folder()).empty()};
  LogEvent("drag", std::to_string(dragged.paths.size()) + (dragged.mayMove ? "" : " copy"));
  return dragged;
}

void BrowserPage::BeginDrag() {
  const DraggedFiles dragged = FilesToDrag();
  if (dragged.paths.empty()) return;
  FileListData files(dragged.paths);
  wxDropSource source(files, this);
  const int flags = dragged.mayMove ? wxDrag_AllowMove : wxDrag_CopyOnly;
  if (source.DoDragDrop(flags) == wxDragMove) Reload();
}

}  // namespace fotomill::desktop
