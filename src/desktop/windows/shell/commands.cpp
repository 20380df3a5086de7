#include "desktop/windows/shell/commands.h"

#include "core/choice_lists.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/compare/compare_frame.h"
#include "desktop/windows/dialogs/command_finder.h"
#include "desktop/windows/dialogs/select_dialog.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/sequential_rename_dialog.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/folder_pane.h"
#include "desktop/windows/shell/frame_session.h"
#include "desktop/windows/shell/function_toolbar.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/shell/tool_windows.h"

namespace fotomill::desktop {

namespace {

// A command of the browser in front.
template <void (BrowserPage::*action)()>
void OfBrowser(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) (browser->*action)();
}

template <int32_t view>
void ShowAs(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->SetViewMode(view);
}

// Whether a mode of the browser in front has a value.
template <int32_t BrowserModes::*mode, int32_t value>
bool Has(Shell& shell) {
  const BrowserPage* browser = shell.Tabs().Front();
  return browser != nullptr && browser->Model().Modes().*mode == value;
}
bool HasFolders(Shell& shell) { return shell.Folders().Shown(); }

template <int32_t mode>
void ThumbnailsFrom(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->SetThumbnailMode(mode);
}

// Sorts by a mode; chosen again, the other way round.
template <int32_t sort>
void SortBy(Shell& shell) {
  BrowserPage* browser = shell.Tabs().Front();
  if (browser == nullptr) return;
  browser->SetSort(sort, browser->Model().Modes().sort == sort && !browser->Model().Descending());
}

template <void (Selection::*action)()>
void Select(Shell& shell) {
  BrowserPage* browser = shell.Tabs().Front();
  if (browser == nullptr) return;
  (browser->Model().Selected().*action)();
  browser->SelectionChanged();
}

void SelectByPattern(Shell& shell) {
  BrowserPage* browser = shell.Tabs().Front();
  if (browser != nullptr && AskAndSelect(shell.Window(), browser->Model())) browser->SelectionChanged();
}

void SelectSameType(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) {
    browser->Model().SelectSameType();
    browser->SelectionChanged();
  }
}

// A command of the frame's file actions.
template <void (FileActions::*action)()>
void OfFiles(Shell& shell) {
  (shell.Files().*action)();
}
void Cut(Shell& shell) { shell.Files().ToClipboard(shell.Tabs().SelectedPaths(), true); }
void Copy(Shell& shell) { shell.Files().ToClipboard(shell.Tabs().SelectedPaths(), false); }
void CopyPaths(Shell& shell) { shell.Files().PathsToClipboard(shell.Tabs().SelectedPaths()); }
void Paste(Shell& shell) { shell.Files().Paste(shell.Tabs().CurrentFolder()); }
void NewFolder(Shell& shell) { shell.Files().NewFolder(shell.Tabs().CurrentFolder()); }

template <Orientation turn>
void Turn(Shell& shell) {
  TurnSelection(shell, turn);
}
void NewTab(Shell& shell) { shell.Tabs().Open(shell.Tabs().CurrentFolder()); }
void CloseTab(Shell& shell) { shell.Tabs().Close(); }
void ReopenTab(Shell& shell) { shell.Tabs().Reopen(); }
void SaveTabSet(Shell& shell) { shell.Session().SaveTabSet(); }
void OpenTabSet(Shell& shell) { shell.Session().OpenTabSet(); }
void NextTab(Shell& shell) { shell.Tabs().Step(1); }
void PreviousTab(Shell& shell) { shell.Tabs().Step(-1); }
void ChooseToolbar(Shell& shell) { shell.Toolbar().Choose(); }
void Quit(Shell& shell) { shell.Window().Close(); }
void ToggleFolders(Shell& shell) { shell.Folders().Show(!shell.Folders().Shown()); }
void ReadFoldersAgain(Shell& shell) { shell.FilesChanged(); }
void ToggleFavourite(Shell& shell) { shell.Folders().ToggleFavourite(shell.Tabs().CurrentFolder()); }
bool IsFavourite(Shell& shell) { return shell.Folders().IsFavourite(shell.Tabs().CurrentFolder()); }
void Larger(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->ChangeSize(1);
}
void Smaller(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->ChangeSize(-1);
}
void View(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) shell.Pictures().ViewFromBrowser(files.front());
}

constexpr const char* kFile = "&File";
constexpr const char* kEdit = "&Edit";
constexpr const char* kView = "&View";
constexpr const char* kGo = "&Go";
constexpr const char* kFunctions = "F&unctions";
constexpr const char* kTools = "&Tools";
constexpr const char* kHelp = "&Help";

// clang-format off
constexpr Command kCommands[] = {
    {kFile, "New &tab",            "Ctrl+T",       "Opens another tab on this folder.", Needs::Nothing, NewTab},
    {kFile, "&Close tab",          "Ctrl+W",       "Closes this tab.", Needs::Nothing, CloseTab},
    {kFile, "&Reopen closed tab",  "Ctrl+Shift+T", "Opens the tab that was closed last.", Needs::ClosedTab, ReopenTab},
    {kFile, "&Save tabs as...",     "",             "Keeps the tabs under a name.", Needs::Nothing, SaveTabSet},
    {kFile, "T&ab sets...",         "",             "Opens tabs that were kept under a name.", Needs::Nothing, OpenTabSet},
    {kFile, nullptr},
    {kFile, "New &folder...",      "Ctrl+Shift+N", "Makes a folder in this one.", Needs::Nothing, NewFolder},
    {kFile, nullptr},
    {kFile, "&Quit",               "Ctrl+Q",       "Ends the program.", Needs::Nothing, Quit},

    {kEdit, "&Undo",               "Ctrl+Z",       "Takes the last thing done to files back.", Needs::Undo, OfFiles<&FileActions::Undo>},
    {kEdit, "Re&do",               "Ctrl+Y",       "Does again what was taken back.", Needs::Redo, OfFiles<&FileActions::Redo>},
    {kEdit, nullptr},
    {kEdit, "Cu&t",                "Ctrl+X",       "Puts the files on the clipboard, to be moved.", Needs::Item, Cut},
    {kEdit, "&Copy",               "Ctrl+C",       "Puts the files on the clipboard, to be copied.", Needs::Item, Copy, nullptr, true},
    {kEdit, "&Paste",              "Ctrl+V",       "Copies or moves the files of the clipboard to this folder; a picture becomes a file.", Needs::Nothing, Paste},
    {kEdit, "Copy pat&hs",         "Ctrl+Shift+C", "Puts the paths of the files on the clipboard as text.", Needs::Item, CopyPaths, nullptr, true},
    {kEdit, nullptr},
    {kEdit, "&Rename...",          "F2",           "Gives the focused file another name.", Needs::Item, OfBrowser<&BrowserPage::EditFocusedName>, nullptr, true},
    {kEdit, nullptr},
    {kEdit, "Select &all",         "Ctrl+A",       "Selects all files that are shown.", Needs::Nothing, Select<&Selection::SelectAll>},
    {kEdit, "Select &none",        "Ctrl+Shift+A", "Selects nothing.", Needs::Nothing, Select<&Selection::SelectNone>},
    {kEdit, "&Invert selection",   "Ctrl+I",       "Selects what is not selected.", Needs::Nothing, Select<&Selection::Invert>},
    {kEdit, "Select by p&attern...", "Ctrl+S",     "Selects files by a part of their names, or a pattern.", Needs::Nothing, SelectByPattern},
    {kEdit, "Select same t&ype",   "",             "Selects all files of the focused file's type.", Needs::Item, SelectSameType},
    {kEdit, nullptr},
    {kEdit, "&Filter",             "Ctrl+F",       "Shows only files whose names match.", Needs::Nothing, OfBrowser<&BrowserPage::EditFilter>},

    {kView, "&List",               "Ctrl+1",       "Shows names only.", Needs::Nothing, ShowAs<choice::kViewList>, nullptr, false, Has<&BrowserModes::view, choice::kViewList>},
    {kView, "&Details",            "Ctrl+2",       "Shows names with type, size, date and dimensions.", Needs::Nothing, ShowAs<choice::kViewDetails>, nullptr, false, Has<&BrowserModes::view, choice::kViewDetails>},
    {kView, "&Small thumbnails",   "Ctrl+3",       "Shows small thumbnails.", Needs::Nothing, ShowAs<choice::kViewSmall>, nullptr, false, Has<&BrowserModes::view, choice::kViewSmall>},
    {kView, "&Normal thumbnails",  "Ctrl+4",       "Shows thumbnails of 96 pixels.", Needs::Nothing, ShowAs<choice::kViewNormal>, nullptr, false, Has<&BrowserModes::view, choice::kViewNormal>},
    {kView, "Lar&ge thumbnails",   "Ctrl+5",       "Shows thumbnails of 176 pixels.", Needs::Nothing, ShowAs<choice::kViewLarge>, nullptr, false, Has<&BrowserModes::view, choice::kViewLarge>},
    {kView, "Lar&ger",             "Ctrl++",       "Shows larger thumbnails.", Needs::Nothing, Larger},
    {kView, "S&maller",            "Ctrl+-",       "Shows smaller thumbnails.", Needs::Nothing, Smaller},
    {kView, nullptr},
    {kView, "Sort by na&me",       "",             "Sorts by name; again, the other way round.", Needs::Nothing, SortBy<choice::kSortName>, nullptr, false, Has<&BrowserModes::sort, choice::kSortName>},
    {kView, "Sort by &type",       "",             "Sorts by type; again, the other way round.", Needs::Nothing, SortBy<choice::kSortType>, nullptr, false, Has<&BrowserModes::sort, choice::kSortType>},
    {kView, "Sort by si&ze",       "",             "Sorts by size; again, the other way round.", Needs::Nothing, SortBy<choice::kSortSize>, nullptr, false, Has<&BrowserModes::sort, choice::kSortSize>},
    {kView, "Sort by d&ate",       "",             "Sorts by date; again, the other way round.", Needs::Nothing, SortBy<choice::kSortDate>, nullptr, false, Has<&BrowserModes::sort, choice::kSortDate>},
    {kView, "Sort by E&XIF date",  "",             "Sorts by the date on which pictures were taken; again, the other way round.", Needs::Nothing, SortBy<choice::kSortExifDate>, nullptr, false, Has<&BrowserModes::sort, choice::kSortExifDate>},
    {kView, "Sort by d&imensions", "",             "Sorts by the number of pixels; again, the other way round.", Needs::Nothing, SortBy<choice::kSortDimensions>, nullptr, false, Has<&BrowserModes::sort, choice::kSortDimensions>},
    {kView, nullptr},
    {kView, "T&humbnails: disk-based", "",         "Thumbnails come from the files beside the pictures.", Needs::Nothing, ThumbnailsFrom<choice::kDiskBased>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kDiskBased>},
    {kView, "Thumbnails: &virtual", "",            "Thumbnails are kept in memory only.", Needs::Nothing, ThumbnailsFrom<choice::kVirtual>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kVirtual>},
    {kView, "Thumbnails: glo&bal database", "",    "Thumbnails come from the database in the data folder.", Needs::Nothing, ThumbnailsFrom<choice::kGlobalDatabase>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kGlobalDatabase>},
    {kView, "Thumbnails: lo&cal database", "",     "Thumbnails come from the database in the folder.", Needs::Nothing, ThumbnailsFrom<choice::kLocalDatabase>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kLocalDatabase>},
    {kView, nullptr},
    {kView, "Columns of the detai&ls...", "",      "Lets you choose the columns of the details.", Needs::Nothing, OfBrowser<&BrowserPage::ChooseColumns>},
    {kView, "&Folders",            "F9",           "Shows or hides the folders at the left.", Needs::Nothing, ToggleFolders, nullptr, false, HasFolders},
    {kView, "&Refresh",            "F5",           "Reads the folders again.", Needs::Nothing, ReadFoldersAgain},

    {kGo, "&Back",                 "Alt+Left",     "Goes to the folder before this one.", Needs::Nothing, OfBrowser<&BrowserPage::GoBack>},
    {kGo, "&Forward",              "Alt+Right",    "Goes forward again.", Needs::Nothing, OfBrowser<&BrowserPage::GoForward>},
    {kGo, "Folders gone t&hrough...", "Alt+Down",  "Offers the folders that this tab showed.", Needs::Nothing, OfBrowser<&BrowserPage::OfferTrail>},
    {kGo, "&Parent folder",        "Alt+Up",       "Goes to the folder above this one.", Needs::Nothing, OfBrowser<&BrowserPage::GoUp>},
    {kGo, "&Enter a folder",       "Ctrl+L",       "Lets you type a folder.", Needs::Nothing, OfBrowser<&BrowserPage::EditPath>},
    {kGo, "F&avourite",            "Ctrl+D",       "Keeps this folder at the top of the folders at the left, or takes it away from there.", Needs::Nothing, ToggleFavourite, nullptr, false, IsFavourite},
    {kGo, nullptr},
    {kGo, "&Next tab",             "Ctrl+PageDown", "Goes to the next tab.", Needs::Nothing, NextTab, nullptr, false, nullptr, "Ctrl+Tab"},
    {kGo, "Pre&vious tab",         "Ctrl+PageUp",  "Goes to the previous tab.", Needs::Nothing, PreviousTab, nullptr, false, nullptr, "Ctrl+Shift+Tab"},

    {kFunctions, "&View",          "Ctrl+Return",  "Shows the focused picture in a view window.", Needs::Files, View, "view", true},
    {kFunctions, "Com&pare",       "Ctrl+Shift+Return", "Shows two to four selected pictures beside each other.", Needs::Few, CompareSelection, nullptr, true},
    {kFunctions, "&Convert...",    "Ctrl+E",       "Writes the selected pictures in another format.", Needs::Files, ConvertSelection, "convert", true},
    {kFunctions, "Rotate &left",   "Ctrl+Alt+L",   "Rotates the selected pictures in their files; JPEG loses nothing.", Needs::Files, Turn<Orientation::QuarterLeft>, nullptr, true},
    {kFunctions, "Rotate r&ight",  "Ctrl+Alt+R",   "Rotates the selected pictures in their files; JPEG loses nothing.", Needs::Files, Turn<Orientation::QuarterRight>, nullptr, true},
    {kFunctions, "&Get info...",   "Alt+Return",   "Tells what the selected files hold.", Needs::Files, ShowInfo, "info", true},
    {kFunctions, "E&XIF...",       "Alt+Shift+Return", "Shows what the camera wrote into the focused picture.", Needs::Files, ShowExif, "exif", true},
    {kFunctions, nullptr},
    {kFunctions, "C&opy to...",    "F7",           "Copies the selected files to a folder.", Needs::Item, CopySelectionTo, "copy", true},
    {kFunctions, "&Move to...",    "F6",           "Moves the selected files to a folder.", Needs::Item, MoveSelectionTo, "move", true},
    {kFunctions, "&Rename...",     "Shift+F2",     "Numbers the selected files.", Needs::Files, RenameSelectionSequentially, "rename"},
    {kFunctions, "&Delete",        "Delete",       "Moves the selected files to the trash.", Needs::Item, TrashSelection, "trash", true},
    {kFunctions, "Delete for &good...", "Shift+Delete", "Deletes the selected files; this cannot be undone.", Needs::Item, DeleteSelection},

    {kTools, "File &history...",     "Ctrl+H",       "Lists the files used last and what for.", Needs::Nothing, ShowFileHistory, "history"},
    {kTools, "&Compact database...", "",             "Takes deleted thumbnails out of a thumbnail database.", Needs::Nothing, ShowCompaction},
    {kTools, "Clean up &thumbnails...", "",          "Deletes thumbnail files whose pictures are gone.", Needs::Nothing, ShowCleanUp},
    {kTools, "&Plug-ins...",         "",             "Lists the plug-in formats and opens their settings.", Needs::Nothing, ShowPlugins},
    {kTools, "Tool&bar...",          "",             "Chooses the buttons of the toolbar and their order.", Needs::Nothing, ChooseToolbar},
    {kTools, nullptr},
    {kTools, "&Setup...",            "Ctrl+,",       "Shows all settings.", Needs::Nothing, ShowSetup, "setup"},

    {kHelp, "&Find command...",      "Ctrl+K",       "Finds a command by words of its name.", Needs::Nothing, FindCommand},
    {kHelp, "&Manual",               "F1",           "Tells what the windows can do, and with which keys.", Needs::Nothing, ShowManual},
    {kHelp, "&Configuration",        "",             "Tells how settings are kept.", Needs::Nothing, ShowConfigurationHelp},
};
// clang-format on

}  // namespace

std::span<const Command> Commands() { return kCommands; }

const Command& CommandOfId(int id) { return kCommands[id - kFirstCommandId]; }

bool IsCommandId(int id) { return id >= kFirstCommandId && id < kFirstCommandId + static_cast<int>(std::size(kCommands)); }

bool CanRun(const Command& command, Shell& shell) {
  const BrowserPage* browser = shell.Tabs().Front();
  switch (command.needs) {
    case Needs::Files: return browser != nullptr && browser->Model().HasFileForFunction();
    case Needs::Few: return browser != nullptr && CompareFrame::CanShow(browser->Model().Selected().SelectedCount());
    case Needs::Item: return browser != nullptr && browser->Model().HasPathForFunction();
    case Needs::ClosedTab: return shell.Tabs().HasClosed();
    case Needs::Undo: return shell.Files().Undoable().CanUndo() && !shell.Files().Busy();
    case Needs::Redo: return shell.Files().Undoable().CanRedo() && !shell.Files().Busy();
    case Needs::Nothing: break;
  }
  return true;
}

const char* WhyNot(Needs needs) {
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

const Command* CommandOfSymbol(std::string_view symbol) {
  const auto has = [symbol](const Command& command) { return command.symbol != nullptr && command.symbol == symbol; };
  const auto* const found = std::ranges::find_if(kCommands, has);
  return found == std::end(kCommands) ? nullptr : found;
}

}  // namespace fotomill::desktop
