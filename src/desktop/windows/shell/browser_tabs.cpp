#include "desktop/windows/shell/browser_tabs.h"

#include <wx/aui/auibook.h>
#include <wx/frame.h>
#include <wx/weakref.h>

#include "desktop/models/archive/archive_listing.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/shell/favorites.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/folder_drop.h"
#include "desktop/windows/shell/flat_tab_art.h"
#include "desktop/windows/shell/frame_menus.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kViewsMs = 2000;  // delay after the last change

}  // namespace

wxString FolderLabel(const std::string& folder) {
  return folder == "/" ? wxString("/") : Shown(platform::FileNameOf(folder));
}

BrowserTabs::BrowserTabs(wxWindow* parent, Shell& shell, FrameMenus& menus,
                         std::function<void()> changed)
    : shell_(shell), menus_(menus), changed_(std::move(changed)) {
  views_.Load();
  closed_.Load();
  viewsTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { (void)views_.Save(); });
  book_ = new wxAuiNotebook(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                            wxAUI_NB_TOP | wxAUI_NB_TAB_MOVE | wxAUI_NB_SCROLL_BUTTONS |
                                wxAUI_NB_CLOSE_ON_ALL_TABS | wxAUI_NB_MIDDLE_CLICK_CLOSE |
                                wxBORDER_NONE);
  book_->SetArtProvider(new FlatTabArt);
  book_->Bind(wxEVT_AUINOTEBOOK_PAGE_CHANGED, &BrowserTabs::OnTabChanged, this);
  book_->Bind(wxEVT_AUINOTEBOOK_PAGE_CLOSED, [this](wxAuiNotebookEvent& event) {
    ShowStrip();
    event.Skip();
  });
  book_->Bind(wxEVT_AUINOTEBOOK_PAGE_CLOSE, [this](wxAuiNotebookEvent& event) {
    if (book_->GetPageCount() == 1) return event.Veto();
    closed_.Add(PageAt(static_cast<size_t>(event.GetSelection()))->Model().Folder());
  });
}

wxWindow& BrowserTabs::Window() const { return *book_; }

// --- current browser ---

BrowserPage* BrowserTabs::PageAt(size_t tab) const {
  return static_cast<BrowserPage*>(book_->GetPage(tab));
}

BrowserPage* BrowserTabs::Front() const {
  const int tab = book_->GetSelection();
  return tab == wxNOT_FOUND ? nullptr : PageAt(static_cast<size_t>(tab));
}

std::vector<std::string> BrowserTabs::SelectedFiles() const {
  const BrowserPage* browser = Front();
  return browser == nullptr ? std::vector<std::string>() : browser->Model().FilesForFunction();
}

std::vector<std::string> BrowserTabs::SelectedPaths() const {
  const BrowserPage* browser = Front();
  return browser == nullptr ? std::vector<std::string>() : browser->Model().PathsForFunction();
}

std::string BrowserTabs::CurrentFolder() const {
  const BrowserPage* browser = Front();
  return browser == nullptr ? platform::CurrentFolder() : browser->Model().Folder();
}

void BrowserTabs::SelectFiles(const std::vector<std::string>& files) {
  BrowserPage* browser = Front();
  if (browser == nullptr) return;
  BrowserModel& model = browser->Model();
  model.Selected().SelectNone();
  for (const std::string& file : files) {
    const size_t line = model.LineOfPath(file);
    if (line != kNoLine) model.Selected().Set(line, true);
  }
  browser->SelectionChanged();
}

void BrowserTabs::SelectWhenListed(const std::vector<std::string>& files) {
  for (size_t tab = 0; tab < book_->GetPageCount(); ++tab) {
    const std::string folder = platform::JoinFolder(PageAt(tab)->Model().Folder(), "");
    std::vector<std::string> names;
    for (const std::string& file : files) {
      const BrowserPage& page = *PageAt(tab);
      const bool shown = page.ShowsFound() || page.ShowsSubfolders()
                             ? file.starts_with(folder)
                             : platform::SplitPath(file).folder == folder;
      if (shown) names.push_back(file.substr(folder.size()));
    }
    if (!names.empty()) PageAt(tab)->SelectWhenListed(std::move(names));
  }
}

// --- tabs ---

BrowserPage* BrowserTabs::Open(const std::string& folder) {
  FolderView view{
      {settings.DefaultThumbnailMode, settings.DefaultViewMode, settings.DefaultSortMode}};
  const BrowserPage* const front = Front();
  if (front != nullptr) view = front->Model().View();
  auto* page = new BrowserPage(book_, *this, shell_.Thumbnails(), view);
  if (front != nullptr) page->SetAsksForThumbnails(front->AsksForThumbnails());
  book_->AddPage(page, FolderLabel(folder), true);
  page->Open(folder);
  page->FocusList();
  return page;
}

BrowserPage* BrowserTabs::Show(const std::string& folder) {
  for (size_t tab = 0; tab < book_->GetPageCount(); ++tab) {
    if (PageAt(tab)->Model().Folder() != folder || PageAt(tab)->ShowsFound()) continue;
    book_->SetSelection(tab);
    return PageAt(tab);
  }
  return Open(folder);
}

BrowserPage* BrowserTabs::FoundPage() const {
  for (size_t tab = 0; tab < book_->GetPageCount(); ++tab) {
    if (PageAt(tab)->ShowsFound()) return PageAt(tab);
  }
  return nullptr;
}

BrowserPage* BrowserTabs::ShowFound(const std::string& folder,
                                    const std::vector<std::string>& names, const FolderView& view,
                                    BrowserPage* page) {
  const int tab = page == nullptr ? wxNOT_FOUND : book_->GetPageIndex(page);
  if (tab == wxNOT_FOUND) {
    page = new BrowserPage(book_, *this, shell_.Thumbnails(), view);
    book_->AddPage(page, Label("Found"), true);
  } else if (book_->GetSelection() != tab) {
    book_->SetSelection(static_cast<size_t>(tab));
  }
  page->ShowFound(folder, names, view);
  return page;
}

void BrowserTabs::Close() {
  const int tab = book_->GetSelection();
  if (tab == wxNOT_FOUND || book_->GetPageCount() == 1) return;
  closed_.Add(PageAt(static_cast<size_t>(tab))->Model().Folder());
  book_->DeletePage(static_cast<size_t>(tab));
}

void BrowserTabs::Reopen() {
  const auto folder = closed_.Pop();
  if (!folder) return;
  Open(*folder)->CloseIfMissing();
}

void BrowserTabs::Step(int step) {
  const int count = static_cast<int>(book_->GetPageCount());
  if (count > 1)
    book_->SetSelection(static_cast<size_t>((book_->GetSelection() + step + count) % count));
}

void BrowserTabs::OnTabChanged(wxAuiNotebookEvent& event) {
  const int left = event.GetOldSelection();
  if (left != wxNOT_FOUND && static_cast<size_t>(left) < book_->GetPageCount())
    PageAt(static_cast<size_t>(left))->KeepColumns();
  for (wxWindow* const window : book_->GetChildren()) {
    auto* const tabs = dynamic_cast<wxAuiTabCtrl*>(window);
    if (tabs == nullptr) continue;
    tabs->SetName(Label("Tabs"));
    if (tabs->GetDropTarget() != nullptr) continue;
    // Files dropped on a tab go to its folder.
    const auto folder = [tabs](const wxPoint& place) {
      wxWindow* page = nullptr;
      const bool hit = tabs->TabHitTest(place.x, place.y, &page);
      return hit ? static_cast<BrowserPage*>(page)->Model().Folder() : std::string();
    };
    const auto drop = [this](const std::vector<std::string>& files, const std::string& to,
                             bool move) { DropFiles(files, to, move); };
    tabs->SetDropTarget(new FolderDrop(folder, drop));
  }
  if (BrowserPage* browser = Front()) {
    browser->Activated();
    shell_.Window().CallAfter([this] {
      if (BrowserPage* shown = Front()) shown->FocusList();
    });
  }
  BrowserChanged();
  event.Skip();
}

void BrowserTabs::Reload() {
  for (size_t tab = 0; tab < book_->GetPageCount(); ++tab) PageAt(tab)->Reload();
}

void BrowserTabs::FollowRename(const std::string& from, const std::string& to) {
  for (size_t tab = 0; tab < book_->GetPageCount(); ++tab) {
    const std::string& folder = PageAt(tab)->Model().Folder();
    PageAt(tab)->FollowRename(from, to);
    if (LiesIn(folder, from)) PageAt(tab)->Open(RenamedPath(folder, from, to));
  }
}

// --- session ---

void BrowserTabs::Restore(const Session& session) {
  const size_t first = book_->GetPageCount();
  for (const SessionTab& tab : session.tabs) {
    auto* page = new BrowserPage(book_, *this, shell_.Thumbnails(), tab.view);
    book_->AddPage(page, FolderLabel(tab.folder));
    book_->SetPageToolTip(book_->GetPageCount() - 1, Shown(tab.folder));
    page->SetAsksForThumbnails(tab.asksForThumbnails);
    page->Open(tab.folder, tab.focus);
    page->RestoreScroll(tab.scroll);
    page->CloseIfMissing();
  }
  book_->SetSelection(first + session.tab);
  if (BrowserPage* browser = Front()) {
    browser->Activated();
    browser->FocusList();
  }
  BrowserChanged();
}

void BrowserTabs::Replace(const Session& session) {
  const size_t old = book_->GetPageCount();
  Restore(session);
  for (size_t tab = 0; tab < old; ++tab) book_->DeletePage(0);
}

void BrowserTabs::Keep(Session& session) {
  if (BrowserPage* browser = Front()) {
    session.tab = static_cast<size_t>(book_->GetSelection());
    browser->KeepColumns();
  }
  session.columns = DetailColumnsText(columns_);
  for (size_t tab = 0; tab < book_->GetPageCount(); ++tab) {
    // found files are not kept, unless no other tab is open
    if (PageAt(tab)->ShowsFound() && book_->GetPageCount() > 1) {
      if (tab <= session.tab && session.tab > 0) --session.tab;
      continue;
    }
    const BrowserModel& model = PageAt(tab)->Model();
    const size_t focus = model.Selected().Focus();
    session.tabs.push_back({model.Folder(), model.View(), PageAt(tab)->Scroll(),
                            focus == kNoLine ? std::string() : model.Line(focus).name,
                            PageAt(tab)->AsksForThumbnails()});
  }
  (void)views_.Save();
}

// One tab needs no strip.
void BrowserTabs::ShowStrip() {
  const int height = settings.TabbedBarEnable != 0 && book_->GetPageCount() > 1 ? -1 : 0;
  if (height == stripHeight_) return;
  book_->SetTabCtrlHeight(stripHeight_ = height);
  LogEvent("tab-strip", std::to_string(height));
}

// --- BrowserHost ---

void BrowserTabs::BrowserChanged() {
  ShowStrip();
  const BrowserPage* browser = Front();
  if (browser == nullptr) return;
  const std::string& folder = browser->Model().Folder();
  const size_t tab = static_cast<size_t>(book_->GetSelection());
  const wxString label =
      browser->ShowsFound() ? Label("Found in %1", FolderLabel(folder)) : FolderLabel(folder);
  if (book_->GetPageText(tab) != label) book_->SetPageText(tab, label);
  if (book_->GetPageToolTip(tab) != Shown(folder)) book_->SetPageToolTip(tab, Shown(folder));
  changed_();
  LogState();
}

// Later, as the browser is calling.
void BrowserTabs::CloseBrowser(BrowserPage& browser) {
  shell_.Window().CallAfter([this, weak = wxWeakRef<BrowserPage>(&browser)] {
    const int tab = weak == nullptr ? wxNOT_FOUND : book_->GetPageIndex(weak);
    if (tab == wxNOT_FOUND) return;
    shell_.Report(Tr("%1 no longer exists.", weak->Model().Folder()));
    if (book_->GetPageCount() > 1) {
      book_->DeletePage(static_cast<size_t>(tab));
    } else {
      weak->Open(platform::SpecialFolderPath(platform::SpecialFolder::Pictures));
    }
    BrowserChanged();
  });
}

void BrowserTabs::KeepView(const std::string& folder, const FolderView& view) {
  views_.Keep(folder, view);
  viewsTimer_.StartOnce(kViewsMs);
}

std::string BrowserTabs::NoteAbout(const std::string& folder) const {
  const std::string archive = ArchiveOfFolder(folder);
  if (archive.empty()) return {};
  return Tr("Files in %1. They can be viewed, copied and converted, but not changed.",
            platform::FileNameOf(archive));
}

void BrowserTabs::ViewFile(const std::string& path) {
  if (IsArchiveName(path)) return OpenArchiveFolder(shell_, path);
  shell_.Pictures().ViewFromBrowser(path);
}

void BrowserTabs::ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) {
  onFile ? menus_.ShowContextMenu(window, place) : menus_.ShowFolderMenu(window, place);
}

void BrowserTabs::RenameFile(const std::string& path, const std::string& name) {
  shell_.Files().Rename(path, name);
}

void BrowserTabs::DropFiles(const std::vector<std::string>& files, const std::string& folder,
                            bool move) {
  shell_.Files().Drop(files, folder, move);
}

void BrowserTabs::TagSelected(const TagChanges& changes) {
  shell_.Files().Tag(SelectedFiles(), changes);
}

void BrowserTabs::TagsChanged(const std::vector<std::string>& paths) {
  for (size_t tab = 0; tab < book_->GetPageCount(); ++tab) PageAt(tab)->TagsChanged(paths);
}

void BrowserTabs::LogState() {
  const BrowserPage* browser = Front();
  if (!EventLogOn() || browser == nullptr) return;
  const BrowserModel& model = browser->Model();
  const size_t focus = model.Selected().Focus();
  std::string state = "tabs=" + std::to_string(book_->GetPageCount()) +
                      " lines=" + std::to_string(model.LineCount()) +
                      " items=" + std::to_string(model.ItemCount()) +
                      " selected=" + std::to_string(model.Selected().SelectedCount()) +
                      " missing=" + std::to_string(browser->MissingThumbnails()) +
                      " listing=" + std::to_string(browser->Listing()) +
                      " view=" + std::to_string(model.Modes().view) +
                      " sort=" + std::to_string(model.Modes().sort) +
                      " seen=" + std::to_string(browser->FocusInSight()) +
                      " focus=" + (focus == kNoLine ? std::string("-") : model.Line(focus).name) +
                      " folder=" + model.Folder();
  if (state == loggedState_) return;
  loggedState_ = state;
  LogEvent("browser", state);
}

}  // namespace fotomill::desktop
