#include "desktop/windows/shell/main_frame.h"

#include <wx/aui/auibook.h>
#include <wx/menu.h>
#include <wx/msgdlg.h>
#include <wx/splitter.h>
#include <wx/toolbar.h>

#include <algorithm>
#include <map>

#include "desktop/models/shell/event_log.h"
#include "desktop/models/shell/session.h"
#include "desktop/models/shell/tab_sets.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/browser/folder_tree.h"
#include "desktop/windows/compare/compare_frame.h"
#include "desktop/windows/dialogs/tab_set_box.h"
#include "desktop/windows/dialogs/toolbar_box.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/folder_drop.h"
#include "desktop/windows/files/open_with.h"
#include "desktop/windows/shell/commands.h"
#include "desktop/windows/view/view_frame.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/history_list.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kTitle = "Fotomill Professional";
constexpr int kHistoryMs = 2000;  // after the last use
enum StatusField { kCountField, kMessageField, kFieldCount };

// Why a command cannot be used at present.
const char* WhatIsMissing(Needs needs) {
  switch (needs) {
    case Needs::Files: return "No picture is selected.";
    case Needs::Few: return "Two to four pictures have to be selected.";
    case Needs::Item: return "No file or folder is selected.";
    case Needs::Undo: return "There is nothing to take back.";
    case Needs::Redo: return "There is nothing to do again.";
    case Needs::ClosedTab: return "No tab was closed.";
    case Needs::Nothing: break;
  }
  return "";
}

// With its key, as menus show it and take it.
wxString MenuText(const Command& command) {
  const wxString keys = *command.accelerator == '\0' ? wxString() : wxString("\t") + command.accelerator;
  return command.text + keys;
}

}  // namespace

MainFrame::MainFrame()
    : wxFrame(nullptr, wxID_ANY, kTitle, wxDefaultPosition, wxDefaultSize, wxDEFAULT_FRAME_STYLE, "FotomillProfessional"),
      usesTimer_(this) {
  SetSize(FromDIP(wxSize(1180, 760)));
  views_.Load();
  favourites_.Load();
  closedTabs_ = LoadHistoryList(HistoryList::Tabs);
  std::ranges::reverse(closedTabs_);  // the latest last
  BuildMenus();
  BuildToolbar();
  BuildPanes();
  CreateStatusBar(kFieldCount);
  const int widths[] = {-2, -3};
  SetStatusWidths(kFieldCount, widths);
  SetStatusBarPane(kMessageField);
  batches_ = std::make_unique<BatchRunner>(*this);
  files_ = std::make_unique<FileActions>(*this);
  Bind(wxEVT_CLOSE_WINDOW, &MainFrame::OnClose, this);
  // A volume may have come or gone while others had the keyboard.
  Bind(wxEVT_ACTIVATE, [this](wxActivateEvent& event) {
    if (event.GetActive()) tree_->UpdatePlaces();
    event.Skip();
  });
  Bind(
      wxEVT_TIMER, [this](wxTimerEvent&) { FlushUses(), (void)views_.Save(); }, usesTimer_.GetId());
}

MainFrame::~MainFrame() {
  batches_.reset();
  files_.reset();
  thumbnails_.SetListener(nullptr);
}

// --- menus ---

void MainFrame::BuildMenus() {
  auto* bar = new wxMenuBar;
  std::map<std::string, wxMenu*> menus;
  for (const Command& command : Commands()) {
    wxMenu*& menu = menus[command.menu];
    if (menu == nullptr) bar->Append(menu = new wxMenu, command.menu);
    if (command.text == nullptr) {
      menu->AppendSeparator();
      continue;
    }
    menu->Append(CommandId(command), MenuText(command), command.help, command.checked != nullptr ? wxITEM_CHECK : wxITEM_NORMAL);
  }
  SetMenuBar(bar);
  std::vector<wxAcceleratorEntry> keys;
  for (const Command& command : Commands()) {
    wxAcceleratorEntry key(0, 0, CommandId(command));
    if (command.secondKey != nullptr && key.FromString(wxString("\t") + command.secondKey)) keys.push_back(key);
  }
  SetAcceleratorTable(wxAcceleratorTable(static_cast<int>(keys.size()), keys.data()));
  const int last = kFirstCommandId + static_cast<int>(Commands().size()) - 1;
  Bind(
      wxEVT_MENU,
      [this](wxCommandEvent& event) {
        const Command& command = Commands()[static_cast<size_t>(event.GetId() - kFirstCommandId)];
        if (Enabled(command)) command.run(*this);
      },
      kFirstCommandId, last);
  Bind(
      wxEVT_UPDATE_UI,
      [this](wxUpdateUIEvent& event) {
        const Command& command = Commands()[static_cast<size_t>(event.GetId() - kFirstCommandId)];
        event.Enable(Enabled(command));
        if (event.GetEventObject() == GetToolBar()) ShowTip(command);
        if (command.checked != nullptr) event.Check(command.checked(*this));
        if (command.needs != Needs::Undo && command.needs != Needs::Redo) return;
        const std::string name = command.needs == Needs::Undo ? files_->Undoable().UndoName() : files_->Undoable().RedoName();
        const wxString text = command.text + (name.empty() ? wxString() : " " + Shown(name)) + "\t" + command.accelerator;
        if (event.GetEventObject() == GetMenuBar() || GetMenuBar()->FindItem(event.GetId())->GetItemLabel() != text) {
          GetMenuBar()->FindItem(event.GetId())->SetItemLabel(text);
        }
      },
      kFirstCommandId, last);
}

void MainFrame::BuildToolbar() {
  CreateToolBar(wxTB_FLAT | wxTB_HORIZONTAL | wxTB_TEXT | wxTB_NODIVIDER, wxID_ANY, "Functions");
  FillToolbar();
  // Symbols are in the color of texts.
  Bind(wxEVT_SYS_COLOUR_CHANGED, [this](wxSysColourChangedEvent& event) {
    FillToolbar();
    LogEvent("colors", "changed");
    event.Skip();
  });
}

void MainFrame::FillToolbar() {
  wxToolBar* const bar = GetToolBar();
  bar->ClearTools();
  std::string names;
  for (const ToolbarButton& button : ToolbarButtons()) {
    if (!button.shown) continue;
    const Command& command = *CommandOfSymbol(button.name);
    wxString label = wxControl::RemoveMnemonics(command.text);
    label.EndsWith("...", &label);
    bar->AddTool(CommandId(command), label, Symbol(command.symbol, 20), command.help);
    names += " " + button.name;
  }
  bar->Realize();
  LogEvent("toolbar", names.empty() ? names : names.substr(1));
}

void MainFrame::ChooseToolbar() {
  if (AskForToolbar(*this)) FillToolbar();
}

// The tip of a button that is gray says why.
void MainFrame::ShowTip(const Command& command) {
  const wxString key = *command.accelerator == '\0' ? wxString() : wxString(" (") + command.accelerator + ")";
  const wxString tip = command.help + key + (Enabled(command) ? wxString() : wxString("\n") + WhatIsMissing(command.needs));
  if (GetToolBar()->GetToolShortHelp(CommandId(command)) != tip) GetToolBar()->SetToolShortHelp(CommandId(command), tip);
}

bool MainFrame::Enabled(const Command& command) const {
  const BrowserPage* browser = Browser();
  switch (command.needs) {
    case Needs::Files: return browser != nullptr && browser->Model().HasFileForFunction();
    case Needs::Few: return browser != nullptr && CompareFrame::Takes(browser->Model().Selected().SelectedCount());
    case Needs::Item: return browser != nullptr && browser->Model().HasPathForFunction();
    case Needs::ClosedTab: return HasClosedTab();
    case Needs::Undo: return files_->Undoable().CanUndo() && !files_->Busy();
    case Needs::Redo: return files_->Undoable().CanRedo() && !files_->Busy();
    case Needs::Nothing: break;
  }
  return true;
}

void MainFrame::ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) {
  if (!onFile) return;
  wxMenu menu;
  for (const Command& command : Commands()) {
    if (command.text == nullptr || !command.inContextMenu) continue;
    menu.Append(CommandId(command), MenuText(command), command.help);
  }
  if (wxMenu* programs = NewOpenWithMenu(*this, SelectedFiles())) {
    menu.AppendSeparator();
    menu.AppendSubMenu(programs, "Open &with");
  }
  window.PopupMenu(&menu, place);
}

// --- panes and tabs ---

void MainFrame::BuildPanes() {
  splitter_ = new wxSplitterWindow(this, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxSP_LIVE_UPDATE | wxSP_NOBORDER);
  splitter_->SetMinimumPaneSize(FromDIP(120));
  FolderTree::Events events;
  events.chosen = [this](const std::string& folder) {
    if (BrowserPage* browser = Browser()) browser->Open(folder);
  };
  events.openInTab = [this](const std::string& folder) { OpenTab(folder); };
  events.newFolder = [this](const std::string& folder) { files_->NewFolder(folder); };
  events.rename = [this](const std::string& folder, const std::string& name) { files_->Rename(folder, name); };
  events.toggleFavourite = [this](const std::string& folder) { ToggleFavourite(folder); };
  tree_ = new FolderTree(splitter_, favourites_, events);
  tree_->SetDropTarget(new FolderDrop(
      [this](const wxPoint& place) { return tree_->FolderAt(place); },
      [this](const std::vector<std::string>& files, const std::string& folder, bool move) { DropFiles(files, folder, move); }));
  tabs_ = new wxAuiNotebook(splitter_, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                            wxAUI_NB_TOP | wxAUI_NB_TAB_MOVE | wxAUI_NB_SCROLL_BUTTONS | wxAUI_NB_CLOSE_ON_ALL_TABS |
                                wxAUI_NB_MIDDLE_CLICK_CLOSE | wxBORDER_NONE);
  tabs_->SetArtProvider(new wxAuiGenericTabArt);
  tabs_->Bind(wxEVT_AUINOTEBOOK_PAGE_CHANGED, &MainFrame::OnTabChanged, this);
  tabs_->Bind(wxEVT_AUINOTEBOOK_PAGE_CLOSE, [this](wxAuiNotebookEvent& event) {
    if (tabs_->GetPageCount() == 1) return event.Veto();
    NoteClosed(static_cast<size_t>(event.GetSelection()));
  });
  const int place = settings.RememberNavPaneHPosition > 0 ? settings.RememberNavPaneHPosition : 230;
  splitter_->SplitVertically(tree_, tabs_, FromDIP(place));
}

BrowserPage* MainFrame::PageAt(size_t tab) const { return static_cast<BrowserPage*>(tabs_->GetPage(tab)); }

BrowserPage* MainFrame::Browser() const {
  const int tab = tabs_->GetSelection();
  return tab == wxNOT_FOUND ? nullptr : PageAt(static_cast<size_t>(tab));
}

std::vector<std::string> MainFrame::SelectedFiles() const {
  const BrowserPage* browser = Browser();
  return browser == nullptr ? std::vector<std::string>() : browser->Model().FilesForFunction();
}

std::vector<std::string> MainFrame::SelectedPaths() const {
  const BrowserPage* browser = Browser();
  return browser == nullptr ? std::vector<std::string>() : browser->Model().PathsForFunction();
}

std::string MainFrame::CurrentFolder() const {
  const BrowserPage* browser = Browser();
  return browser == nullptr ? platform::CurrentFolder() : browser->Model().Folder();
}

BrowserPage* MainFrame::ShowFolder(const std::string& folder) {
  for (size_t tab = 0; tab < tabs_->GetPageCount(); ++tab) {
    if (PageAt(tab)->Model().Folder() != folder) continue;
    tabs_->SetSelection(tab);
    return PageAt(tab);
  }
  return OpenTab(folder);
}

BrowserPage* MainFrame::OpenTab(const std::string& folder) {
  FolderView view{{settings.DefaultThumbnailMode, settings.DefaultViewMode, settings.DefaultSortMode}};
  if (const BrowserPage* browser = Browser()) view = browser->Model().View();
  auto* page = new BrowserPage(tabs_, *this, thumbnails_, view);
  tabs_->AddPage(page, Shown(platform::FileNameOf(folder)), true);
  page->Open(folder);
  page->FocusList();
  return page;
}

void MainFrame::RestorePlace() {
  const Session session = LoadSession();
  if (session.width > 0 && session.height > 0)
    SetSize(FromDIP(wxSize(std::max(session.width, 400), std::max(session.height, 300))));
  if (session.maximized) Maximize();
  columns_ = ParseDetailColumns(session.columns);
  if (settings.RememberOpenWindows != 0) lastTabs_ = session;
}

bool MainFrame::RestoreTabs() {
  if (lastTabs_.tabs.empty()) return false;
  OpenTabs(std::exchange(lastTabs_, {}));
  return true;
}

void MainFrame::OpenTabs(const Session& session) {
  const size_t first = tabs_->GetPageCount();
  for (const SessionTab& tab : session.tabs) {
    auto* page = new BrowserPage(tabs_, *this, thumbnails_, tab.view);
    tabs_->AddPage(page, Shown(platform::FileNameOf(tab.folder)));
    tabs_->SetPageToolTip(tabs_->GetPageCount() - 1, Shown(tab.folder));
    page->Open(tab.folder, tab.focus);
    page->RestoreScroll(tab.scroll);
  }
  tabs_->SetSelection(first + session.tab);
  if (BrowserPage* browser = Browser()) {
    browser->Activated();
    browser->FocusList();
  }
  BrowserChanged();
}

// The tabs under a name of their own, to which they are also written in the end.
void MainFrame::SaveTabSet() {
  const auto name = AskForTabSetName(*this);
  if (!name) return;
  const SettingText before = std::exchange(settings.TabsetCurrentName, SettingText(TabSetFile(*name)));
  if (!KeepSession(true)) {
    settings.TabsetCurrentName = before;
    wxMessageBox("The tab set could not be written.", kTitle, wxOK | wxICON_WARNING, this);
    return;
  }
  (void)SaveConfiguration();
  LogEvent("tab-set", "saved " + *name);
}

// Other tabs come in the place of those that are open, which their own set keeps.
void MainFrame::OpenTabSet() {
  const auto name = ChooseTabSet(*this);
  if (!name || *name == CurrentTabSet()) return;
  if (!KeepSession(true)) return Tell("The tabs that are open could not be kept, so they stay.");
  const SettingText before = std::exchange(settings.TabsetCurrentName, SettingText(TabSetFile(*name)));
  const Session session = LoadSession();
  if (session.tabs.empty()) {
    settings.TabsetCurrentName = before;
    return Tell("The folders of this tab set are not there any more.");
  }
  const size_t old = tabs_->GetPageCount();
  lastTabs_ = {};
  OpenTabs(session);
  for (size_t tab = 0; tab < old; ++tab) tabs_->DeletePage(0);
  (void)SaveConfiguration();
  LogEvent("tab-set", "opened " + *name);
}

bool MainFrame::KeepSession(bool withTabs) {
  Session session;
  session.maximized = IsMaximized();
  if (session.maximized) {  // the size to come back to is the last one before
    const Session last = LoadSession();
    session.width = last.width;
    session.height = last.height;
  } else {
    const wxSize size = ToDIP(GetSize());
    session.width = size.x;
    session.height = size.y;
  }
  session.tab = Browser() == nullptr ? lastTabs_.tab : static_cast<size_t>(tabs_->GetSelection());
  if (BrowserPage* browser = Browser()) browser->KeepColumns();
  session.columns = DetailColumnsText(columns_);
  for (size_t tab = 0; tab < tabs_->GetPageCount() && withTabs; ++tab) {
    const BrowserModel& model = PageAt(tab)->Model();
    const size_t focus = model.Selected().Focus();
    session.tabs.push_back(
        {model.Folder(), model.View(), PageAt(tab)->Scroll(), focus == kNoLine ? std::string() : model.Line(focus).name});
  }
  if (withTabs) session.tabs.insert(session.tabs.end(), lastTabs_.tabs.begin(), lastTabs_.tabs.end());
  (void)views_.Save();
  return SaveSession(session);
}

void MainFrame::NoteClosed(size_t tab) {
  const std::string folder = PageAt(tab)->Model().Folder();
  std::erase(closedTabs_, folder);
  closedTabs_.push_back(folder);
  const size_t most = static_cast<size_t>(std::max(settings.TabHistoryMax, 1));
  if (closedTabs_.size() > most) closedTabs_.erase(closedTabs_.begin(), closedTabs_.end() - static_cast<ptrdiff_t>(most));
  (void)AddToHistoryList(HistoryList::Tabs, folder);
}

void MainFrame::CloseTab() {
  const int tab = tabs_->GetSelection();
  if (tab == wxNOT_FOUND || tabs_->GetPageCount() == 1) return;
  NoteClosed(static_cast<size_t>(tab));
  tabs_->DeletePage(static_cast<size_t>(tab));
}

void MainFrame::ReopenTab() {
  if (closedTabs_.empty()) return;
  const std::string folder = closedTabs_.back();
  closedTabs_.pop_back();
  (void)RemoveFromHistoryList(HistoryList::Tabs, folder);
  if (!platform::IsFolder(folder)) return Tell(folder + " is not there any more.");
  OpenTab(folder);
}

void MainFrame::StepTab(int step) {
  const int count = static_cast<int>(tabs_->GetPageCount());
  if (count > 1) tabs_->SetSelection(static_cast<size_t>((tabs_->GetSelection() + step + count) % count));
}

void MainFrame::OnTabChanged(wxAuiNotebookEvent& event) {
  const int left = event.GetOldSelection();
  if (left != wxNOT_FOUND && static_cast<size_t>(left) < tabs_->GetPageCount()) PageAt(static_cast<size_t>(left))->KeepColumns();
  for (wxWindow* const window : tabs_->GetChildren()) {
    if (dynamic_cast<wxAuiTabCtrl*>(window) != nullptr) window->SetName("Tabs");
  }
  if (BrowserPage* browser = Browser()) {
    browser->Activated();
    CallAfter([this] {
      if (BrowserPage* shown = Browser()) shown->FocusList();
    });
  }
  BrowserChanged();
  event.Skip();
}

bool MainFrame::FoldersShown() const { return splitter_->IsSplit(); }

void MainFrame::ShowFolders(bool show) {
  if (show == FoldersShown()) return;
  if (show) {
    tree_->Show();
    splitter_->SplitVertically(tree_, tabs_, FromDIP(std::max(settings.RememberNavPaneHPosition, 160)));
  } else {
    settings.RememberNavPaneHPosition = ToDIP(splitter_->GetSashPosition());
    splitter_->Unsplit(tree_);
  }
}

// --- what browsers ask for ---

void MainFrame::BrowserChanged() {
  const BrowserPage* browser = Browser();
  if (browser == nullptr) return;
  const BrowserModel& model = browser->Model();
  const wxString name = model.Folder() == "/" ? wxString("/") : Shown(platform::FileNameOf(model.Folder()));
  const size_t tab = static_cast<size_t>(tabs_->GetSelection());
  if (tabs_->GetPageText(tab) != name) tabs_->SetPageText(tab, name);
  if (tabs_->GetPageToolTip(tab) != Shown(model.Folder())) tabs_->SetPageToolTip(tab, Shown(model.Folder()));
  if (GetTitle() != name + " - " + kTitle) SetTitle(name + " - " + kTitle);
  SetStatusText(Shown(model.CountText()), kCountField);
  if (wantsList_ != nullptr && !browser->Listing() && wantsList_->TakeList(model.ShownFiles())) wantsList_ = nullptr;
  tree_->Follow(model.Folder());
  LogState();
}

void MainFrame::ViewFile(const std::string& path) {
  const BrowserPage* browser = Browser();
  if (browser == nullptr) return;
  const std::vector<std::string> selected = browser->Model().FilesForFunction();
  ViewFiles(selected.size() > 1 ? selected : browser->Model().ShownFiles(), path);
}

ViewFrame* MainFrame::ViewFiles(const std::vector<std::string>& list, const std::string& file) {
  auto* view = new ViewFrame(*this, list, file);
  view->Show();
  return view;
}

void MainFrame::OpenStart(const std::string& path, bool restore) {
  const auto show = [this, restore](std::string folder) {
    const bool restored = restore && RestoreTabs();
    if (folder.empty() && (restored || Browser() != nullptr)) return;
    if (folder.empty()) folder = platform::SpecialFolderPath(platform::SpecialFolder::Pictures);
    ShowFolder(platform::IsFolder(folder) ? folder : platform::CurrentFolder());
  };
  if (path.empty() || platform::IsFolder(path)) return show(path);
  ViewFrame* const view = ViewFiles({path}, path);
  view->WhenShown([this, show, folder = platform::AbsolutePath(path + "/.."), weak = wxWeakRef<ViewFrame>(view)] {
    wantsList_ = weak.get();
    show(folder);
    // The new tab has asked for the keyboard; it stays with the picture.
    CallAfter([weak] {
      if (weak == nullptr) return;
      weak->Raise();
      weak->Canvas().SetFocus();
    });
  });
}

void MainFrame::RenameFile(const std::string& path, const std::string& name) { files_->Rename(path, name); }

void MainFrame::DropFiles(const std::vector<std::string>& files, const std::string& folder, bool move) {
  if (move) {
    files_->MoveTo(files, folder);
  } else {
    files_->CopyTo(files, folder);
  }
}

void MainFrame::SettingsChanged() {
  thumbnails_.Clear();
  FilesChanged();
}

void MainFrame::SelectFiles(const std::vector<std::string>& files) {
  BrowserPage* browser = Browser();
  if (browser == nullptr) return;
  BrowserModel& model = browser->Model();
  model.Selected().SelectNone();
  for (const std::string& file : files) {
    const size_t line = platform::SplitPath(file).folder == platform::JoinFolder(model.Folder(), "")
                            ? model.FindLine(platform::FileNameOf(file))
                            : kNoLine;
    if (line != kNoLine) model.Selected().Set(line, true);
  }
  browser->SelectionChanged();
}

void MainFrame::ToggleFavourite(const std::string& folder) {
  const bool written = favourites_.Has(folder) ? favourites_.Remove(folder) : favourites_.Add(folder);
  if (!written) Tell("The list of favourites could not be changed.");
  tree_->UpdatePlaces();
  LogEvent("favourites", std::to_string(favourites_.Folders().size()));
}

void MainFrame::FollowRename(const std::string& from, const std::string& to) {
  if (favourites_.FollowRename(from, to)) tree_->UpdatePlaces();
  for (size_t tab = 0; tab < tabs_->GetPageCount(); ++tab) {
    const std::string& folder = PageAt(tab)->Model().Folder();
    if (LiesIn(folder, from)) PageAt(tab)->Open(RenamedPath(folder, from, to));
  }
}

void MainFrame::FilesChanged() {
  tree_->UpdatePlaces();
  tree_->Reread();
  for (size_t tab = 0; tab < tabs_->GetPageCount(); ++tab) PageAt(tab)->Reload();
  for (wxWindow* window : GetChildren()) {
    if (auto* view = dynamic_cast<ViewFrame*>(window)) view->FilesChanged();
    if (auto* compare = dynamic_cast<CompareFrame*>(window)) compare->FilesChanged();
  }
}

void MainFrame::NoteUses(const std::vector<FileUse>& uses) {
  uses_.insert(uses_.end(), uses.begin(), uses.end());
  if (!uses.empty()) usesTimer_.StartOnce(kHistoryMs);
}

void MainFrame::KeepView(const std::string& folder, const FolderView& view) {
  views_.Keep(folder, view);
  usesTimer_.StartOnce(kHistoryMs);
}

void MainFrame::FlushUses() {
  if (!uses_.empty()) (void)UpdateFileHistory(std::exchange(uses_, {}));
}

void MainFrame::Tell(const std::string& text) { SetStatusText(Shown(text), kMessageField); }

// --- state ---

void MainFrame::LogState() {
  const BrowserPage* browser = Browser();
  if (!EventLogOn() || browser == nullptr) return;
  const BrowserModel& model = browser->Model();
  const size_t focus = model.Selected().Focus();
  std::string state =
      "tabs=" + std::to_string(tabs_->GetPageCount()) + " lines=" + std::to_string(model.LineCount()) +
      " items=" + std::to_string(model.ItemCount()) + " selected=" + std::to_string(model.Selected().SelectedCount()) +
      " missing=" + std::to_string(browser->MissingThumbnails()) + " listing=" + std::to_string(browser->Listing()) +
      " view=" + std::to_string(model.Modes().view) + " sort=" + std::to_string(model.Modes().sort) +
      " focus=" + (focus == kNoLine ? std::string("-") : model.Line(focus).name) + " folder=" + model.Folder();
  if (state == loggedState_) return;
  loggedState_ = state;
  LogEvent("browser", state);
}

void MainFrame::OnClose(wxCloseEvent& event) {
  if (batches_->Running() && event.CanVeto()) {
    wxMessageDialog dialog(this, "A batch is running. Stop it and quit?", kTitle, wxOK | wxCANCEL | wxICON_WARNING);
    dialog.SetOKCancelLabels("&Stop and quit", "&Go on");
    if (dialog.ShowModal() != wxID_OK) return event.Veto();
  }
  if (FoldersShown()) settings.RememberNavPaneHPosition = ToDIP(splitter_->GetSashPosition());
  (void)KeepSession(settings.RememberOpenWindows != 0);
  (void)SaveConfiguration();
  FlushUses();
  event.Skip();
}

}  // namespace fotomill::desktop
