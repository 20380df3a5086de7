#include "desktop/windows/shell/commands.h"

#include "core/choice_lists.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/compare/compare_frame.h"
#include "desktop/windows/dialogs/command_finder.h"
#include "desktop/windows/dialogs/select_dialog.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/sequential_rename_dialog.h"
#include "desktop/windows/shell/main_frame.h"
#include "desktop/windows/shell/tool_windows.h"

namespace fotomill::desktop {

namespace {

// A command of the browser in front.
template <void (BrowserPage::*action)()>
void OfBrowser(MainFrame& frame) {
  if (BrowserPage* browser = frame.Browser()) (browser->*action)();
}

template <int32_t view>
void ShowAs(MainFrame& frame) {
  if (BrowserPage* browser = frame.Browser()) browser->SetViewMode(view);
}

// Whether a mode of the browser in front has a value.
template <int32_t BrowserModes::*mode, int32_t value>
bool Has(const MainFrame& frame) {
  const BrowserPage* browser = frame.Browser();
  return browser != nullptr && browser->Model().Modes().*mode == value;
}
bool HasFolders(const MainFrame& frame) { return frame.FoldersShown(); }

template <int32_t mode>
void ThumbnailsFrom(MainFrame& frame) {
  if (BrowserPage* browser = frame.Browser()) browser->SetThumbnailMode(mode);
}

// Sorts by a mode; chosen again, the other way round.
template <int32_t sort>
void SortBy(MainFrame& frame) {
  BrowserPage* browser = frame.Browser();
  if (browser == nullptr) return;
  browser->SetSort(sort, browser->Model().Modes().sort == sort && !browser->Model().Descending());
}

template <void (Selection::*action)()>
void Select(MainFrame& frame) {
  BrowserPage* browser = frame.Browser();
  if (browser == nullptr) return;
  (browser->Model().Selected().*action)();
  browser->SelectionChanged();
}

void SelectByPattern(MainFrame& frame) {
  BrowserPage* browser = frame.Browser();
  if (browser != nullptr && AskAndSelect(frame, browser->Model())) browser->SelectionChanged();
}

void SelectSameType(MainFrame& frame) {
  if (BrowserPage* browser = frame.Browser()) {
    browser->Model().SelectSameType();
    browser->SelectionChanged();
  }
}

// A command of the frame's file actions.
template <void (FileActions::*action)()>
void OfFiles(MainFrame& frame) {
  (frame.Files().*action)();
}
void Cut(MainFrame& frame) { frame.Files().ToClipboard(frame.SelectedPaths(), true); }
void Copy(MainFrame& frame) { frame.Files().ToClipboard(frame.SelectedPaths(), false); }
void CopyPaths(MainFrame& frame) { frame.Files().PathsToClipboard(frame.SelectedPaths()); }
void Paste(MainFrame& frame) { frame.Files().Paste(frame.CurrentFolder()); }
void NewFolder(MainFrame& frame) { frame.Files().NewFolder(frame.CurrentFolder()); }

template <Orientation turn>
void Turn(MainFrame& frame) {
  TurnSelection(frame, turn);
}
void NewTab(MainFrame& frame) { frame.OpenTab(frame.CurrentFolder()); }
void CloseTab(MainFrame& frame) { frame.CloseTab(); }
void ReopenTab(MainFrame& frame) { frame.ReopenTab(); }
void SaveTabSet(MainFrame& frame) { frame.SaveTabSet(); }
void OpenTabSet(MainFrame& frame) { frame.OpenTabSet(); }
void NextTab(MainFrame& frame) { frame.StepTab(1); }
void PreviousTab(MainFrame& frame) { frame.StepTab(-1); }
void ChooseToolbar(MainFrame& frame) { frame.ChooseToolbar(); }
void Quit(MainFrame& frame) { frame.Close(); }
void ToggleFolders(MainFrame& frame) { frame.ShowFolders(!frame.FoldersShown()); }
void ReadFoldersAgain(MainFrame& frame) { frame.FilesChanged(); }
void ToggleFavourite(MainFrame& frame) { frame.ToggleFavourite(frame.CurrentFolder()); }
bool IsFavourite(const MainFrame& frame) { return frame.IsFavourite(frame.CurrentFolder()); }
void Larger(MainFrame& frame) {
  if (BrowserPage* browser = frame.Browser()) browser->ChangeSize(1);
}
void Smaller(MainFrame& frame) {
  if (BrowserPage* browser = frame.Browser()) browser->ChangeSize(-1);
}
void View(MainFrame& frame) {
  const std::vector<std::string> files = frame.SelectedFiles();
  if (!files.empty()) frame.ViewFile(files.front());
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

const Command* CommandOfSymbol(std::string_view symbol) {
  const auto has = [symbol](const Command& command) { return command.symbol != nullptr && command.symbol == symbol; };
  const auto* const found = std::ranges::find_if(kCommands, has);
  return found == std::end(kCommands) ? nullptr : found;
}

}  // namespace fotomill::desktop
