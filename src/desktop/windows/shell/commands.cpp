#include "desktop/windows/shell/commands.h"

#include <wx/control.h>

#include "core/choice_lists.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/archive/archive_frame.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/browser/jump_window.h"
#include "desktop/windows/compare/compare_frame.h"
#include "desktop/windows/dialogs/command_finder.h"
#include "desktop/windows/dialogs/select_dialog.h"
#include "desktop/windows/edit/crop_frame.h"
#include "desktop/windows/edit/edit_frame.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/files/open_dialog.h"
#include "desktop/windows/files/sequential_rename_dialog.h"
#include "desktop/windows/metadata/exif_edit_frame.h"
#include "desktop/windows/metadata/file_time_dialog.h"
#include "desktop/windows/metadata/strip_dialog.h"
#include "desktop/windows/pages/pages_frame.h"
#include "desktop/windows/search/search_window.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/folder_pane.h"
#include "desktop/windows/shell/frame_session.h"
#include "desktop/windows/shell/function_toolbar.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/shell/side_pane.h"
#include "desktop/windows/shell/tool_windows.h"
#include "desktop/windows/similar/similar_frame.h"
#include "desktop/windows/widgets/wx_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// A command for the current browser.
template <void (BrowserPage::*action)()>
void OfBrowser(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) (browser->*action)();
}

template <int32_t view>
void ShowAs(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->SetViewMode(view);
}

// Whether the current browser has a mode set to this value.
template <int32_t BrowserModes::*mode, int32_t value>
bool Has(Shell& shell) {
  const BrowserPage* browser = shell.Tabs().Front();
  return browser != nullptr && browser->Model().Modes().*mode == value;
}
bool HasFolders(Shell& shell) { return shell.Folders().Shown(); }
bool HasSide(Shell& shell) { return shell.Side().Shown(); }

template <int32_t mode>
void ThumbnailsFrom(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->SetThumbnailMode(mode);
}

// Sorts by a mode, in ascending order; keeps the order if that mode is already set.
template <int32_t sort>
void SortBy(Shell& shell) {
  BrowserPage* browser = shell.Tabs().Front();
  if (browser != nullptr && browser->Model().Modes().sort != sort) browser->SetSort(sort, false);
}
void ReverseOrder(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front())
    browser->SetSort(browser->Model().Modes().sort, !browser->Model().Descending());
}
bool IsReversed(Shell& shell) {
  const BrowserPage* browser = shell.Tabs().Front();
  return browser != nullptr && browser->Model().Descending();
}

template <DateGrouping grouping>
void GroupBy(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->SetGrouping(grouping);
}
template <DateGrouping grouping>
bool IsGroupedBy(Shell& shell) {
  const BrowserPage* browser = shell.Tabs().Front();
  return browser != nullptr && browser->Model().Grouping() == grouping;
}

void ToggleSubfolders(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front())
    browser->ShowSubfolders(!browser->ShowsSubfolders());
}
bool HasSubfolders(Shell& shell) {
  const BrowserPage* browser = shell.Tabs().Front();
  return browser != nullptr && browser->ShowsSubfolders();
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
  if (browser != nullptr && AskAndSelect(shell.Window(), browser->Model()))
    browser->SelectionChanged();
}

void SelectSameType(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) {
    browser->Model().SelectSameType();
    browser->SelectionChanged();
  }
}

// A command for the frame's file actions.
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
template <Family family>
void EditWith(Shell& shell) {
  EditSelectionWith(shell, family);
}
void Print(Shell& shell) { PrintSelection(shell, "print"); }
void MakeContactSheet(Shell& shell) { PrintSelection(shell, "contact"); }
void MakeCatalog(Shell& shell) { PrintSelection(shell, "catalog"); }
void MakePhotoPrints(Shell& shell) { PrintSelection(shell, "photo"); }
void MakeGallery(Shell& shell) { PrintSelection(shell, "gallery"); }
void MakePoster(Shell& shell) { PrintSelection(shell, "poster"); }
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
void ToggleSide(Shell& shell) { shell.Side().Show(!shell.Side().Shown()); }
void ReadFoldersAgain(Shell& shell) { shell.FilesChanged(); }
void ToggleFavorite(Shell& shell) {
  shell.Folders().ToggleFavorite(shell.Tabs().CurrentFolder());
}
bool IsFavorite(Shell& shell) { return shell.Folders().IsFavorite(shell.Tabs().CurrentFolder()); }
// By the digit of its key.
template <int key>
void TagAs(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) (void)browser->TagByKey(key);
}
void TagAll(Shell& shell, const char* label) {
  TagChanges changes;
  changes.label = label;
  shell.Files().Tag(shell.Tabs().SelectedFiles(), changes);
}
void TagPurple(Shell& shell) { TagAll(shell, "Purple"); }
void RemoveLabel(Shell& shell) { TagAll(shell, ""); }
void Reject(Shell& shell) {
  TagChanges changes;
  changes.rating = -1;
  shell.Files().Tag(shell.Tabs().SelectedFiles(), changes);
}
void Larger(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->ChangeSize(1);
}
void Smaller(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front()) browser->ChangeSize(-1);
}
template <bool another>
void View(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) shell.Pictures().ViewFromBrowser(files.front(), another);
}

void Jump(Shell& shell) {
  if (BrowserPage* browser = shell.Tabs().Front())
    JumpToFile(shell.Window(), *browser, shell.Thumbnails());
}

constexpr const char* kFile = TrLater("&File");
constexpr const char* kEdit = TrLater("&Edit");
constexpr const char* kView = TrLater("&View");
constexpr const char* kGo = TrLater("&Go");
constexpr const char* kFunctions = TrLater("F&unctions");
constexpr const char* kTags = TrLater("T&ags");
constexpr const char* kTools = TrLater("&Tools");
constexpr const char* kHelp = TrLater("&Help");

// clang-format off
constexpr Command kCommands[] = {
    {kFile, TrLater("&Open..."),            "Ctrl+O",       TrLater("Opens a picture in a view window."), Needs::Nothing, AskAndOpenFile},
    {kFile, nullptr},
    {kFile, TrLater("New &tab"),            "Ctrl+T",       TrLater("Opens this folder in a new tab."), Needs::Nothing, NewTab},
    {kFile, TrLater("&Close tab"),          "Ctrl+W",       TrLater("Closes this tab."), Needs::Nothing, CloseTab},
    {kFile, TrLater("&Reopen closed tab"),  "Ctrl+Shift+T", TrLater("Reopens the last closed tab."), Needs::ClosedTab, ReopenTab},
    {kFile, TrLater("&Save tabs as..."),     "",             TrLater("Saves the open tabs under a name."), Needs::Nothing, SaveTabSet},
    {kFile, TrLater("T&ab sets..."),         "",             TrLater("Opens a saved set of tabs."), Needs::Nothing, OpenTabSet},
    {kFile, nullptr},
    {kFile, TrLater("New &folder..."),      "Ctrl+Shift+N", TrLater("Creates a folder in this folder."), Needs::Nothing, NewFolder, nullptr, false, nullptr, nullptr, false, FolderPlace::Top},
    {kFile, nullptr},
    {kFile, TrLater("&Print..."),           "Ctrl+P",       TrLater("Prints the selected pictures, or saves them as PDF."), Needs::Files, Print},
    {kFile, nullptr},
    {kFile, TrLater("&Quit"),               "Ctrl+Q",       TrLater("Quits the program."), Needs::Nothing, Quit},

    {kEdit, TrLater("&Undo"),               "Ctrl+Z",       TrLater("Undoes the last file operation."), Needs::Undo, OfFiles<&FileActions::Undo>},
    {kEdit, TrLater("Re&do"),               "Ctrl+Y",       TrLater("Redoes the last undone file operation."), Needs::Redo, OfFiles<&FileActions::Redo>},
    {kEdit, nullptr},
    {kEdit, TrLater("Cu&t"),                "Ctrl+X",       TrLater("Cuts the selected files to the clipboard."), Needs::Item, Cut, nullptr, true},
    {kEdit, TrLater("&Copy"),               "Ctrl+C",       TrLater("Copies the selected files to the clipboard."), Needs::Item, Copy, nullptr, true},
    {kEdit, TrLater("&Paste"),              "Ctrl+V",       TrLater("Pastes files from the clipboard into this folder; a picture is saved as a file."), Needs::Nothing, Paste, nullptr, false, nullptr, nullptr, false, FolderPlace::Top},
    {kEdit, TrLater("Copy pat&hs"),         "Ctrl+Shift+C", TrLater("Copies the paths of the selected files as text."), Needs::Item, CopyPaths, nullptr, true},
    {kEdit, nullptr},
    {kEdit, TrLater("&Rename..."),          "F2",           TrLater("Renames the focused file."), Needs::Item, OfBrowser<&BrowserPage::EditFocusedName>, nullptr, true},
    {kEdit, nullptr},
    {kEdit, TrLater("Select &all"),         "Ctrl+A",       TrLater("Selects all visible files."), Needs::Nothing, Select<&Selection::SelectAll>},
    {kEdit, TrLater("Select &none"),        "Ctrl+Shift+A", TrLater("Clears the selection."), Needs::Nothing, Select<&Selection::SelectNone>},
    {kEdit, TrLater("&Invert selection"),   "Ctrl+I",       TrLater("Selects the other files."), Needs::Nothing, Select<&Selection::Invert>},
    {kEdit, TrLater("Select by p&attern..."), "Ctrl+S",     TrLater("Selects files by part of their name or by a pattern."), Needs::Nothing, SelectByPattern},
    {kEdit, TrLater("Select same t&ype"),   "",             TrLater("Selects all files of the focused file's type."), Needs::Item, SelectSameType},
    {kEdit, nullptr},
    {kEdit, TrLater("Find pictur&es..."),   "Ctrl+Shift+F", TrLater("Finds pictures in folders by name, keywords, date and more."), Needs::Nothing, ShowSearch, "find"},
    {kEdit, TrLater("&Jump to file..."),    "Ctrl+J",       TrLater("Finds a file in this folder by its name and selects it."), Needs::Nothing, Jump},
    {kEdit, TrLater("&Filter"),             "Ctrl+F",       TrLater("Shows only files whose names match."), Needs::Nothing, OfBrowser<&BrowserPage::EditFilter>},

    {kView, TrLater("&List"),               "Ctrl+1",       TrLater("Shows names only."), Needs::Nothing, ShowAs<choice::kViewList>, nullptr, false, Has<&BrowserModes::view, choice::kViewList>, nullptr, true, FolderPlace::View},
    {kView, TrLater("&Details"),            "Ctrl+2",       TrLater("Shows names with type, size, date and dimensions."), Needs::Nothing, ShowAs<choice::kViewDetails>, nullptr, false, Has<&BrowserModes::view, choice::kViewDetails>, nullptr, true, FolderPlace::View},
    {kView, TrLater("&Small thumbnails"),   "Ctrl+3",       TrLater("Shows small thumbnails."), Needs::Nothing, ShowAs<choice::kViewSmall>, nullptr, false, Has<&BrowserModes::view, choice::kViewSmall>, nullptr, true, FolderPlace::View},
    {kView, TrLater("&Normal thumbnails"),  "Ctrl+4",       TrLater("Shows thumbnails of 96 pixels."), Needs::Nothing, ShowAs<choice::kViewNormal>, nullptr, false, Has<&BrowserModes::view, choice::kViewNormal>, nullptr, true, FolderPlace::View},
    {kView, TrLater("Lar&ge thumbnails"),   "Ctrl+5",       TrLater("Shows thumbnails of 176 pixels."), Needs::Nothing, ShowAs<choice::kViewLarge>, nullptr, false, Has<&BrowserModes::view, choice::kViewLarge>, nullptr, true, FolderPlace::View},
    {kView, TrLater("Lar&ger"),             "Ctrl++",       TrLater("Shows larger thumbnails."), Needs::Nothing, Larger},
    {kView, TrLater("S&maller"),            "Ctrl+-",       TrLater("Shows smaller thumbnails."), Needs::Nothing, Smaller},
    {kView, nullptr},
    {kView, TrLater("Sort by na&me"),       "",             TrLater("Sorts by name."), Needs::Nothing, SortBy<choice::kSortName>, nullptr, false, Has<&BrowserModes::sort, choice::kSortName>, nullptr, true, FolderPlace::Sort},
    {kView, TrLater("Sort by &type"),       "",             TrLater("Sorts by type."), Needs::Nothing, SortBy<choice::kSortType>, nullptr, false, Has<&BrowserModes::sort, choice::kSortType>, nullptr, true, FolderPlace::Sort},
    {kView, TrLater("Sort by si&ze"),       "",             TrLater("Sorts by size."), Needs::Nothing, SortBy<choice::kSortSize>, nullptr, false, Has<&BrowserModes::sort, choice::kSortSize>, nullptr, true, FolderPlace::Sort},
    {kView, TrLater("Sort by d&ate"),       "",             TrLater("Sorts by date."), Needs::Nothing, SortBy<choice::kSortDate>, nullptr, false, Has<&BrowserModes::sort, choice::kSortDate>, nullptr, true, FolderPlace::Sort},
    {kView, TrLater("Sort by E&XIF date"),  "",             TrLater("Sorts by the date the pictures were taken."), Needs::Nothing, SortBy<choice::kSortExifDate>, nullptr, false, Has<&BrowserModes::sort, choice::kSortExifDate>, nullptr, true, FolderPlace::Sort},
    {kView, TrLater("Sort by d&imensions"), "",             TrLater("Sorts by the number of pixels."), Needs::Nothing, SortBy<choice::kSortDimensions>, nullptr, false, Has<&BrowserModes::sort, choice::kSortDimensions>, nullptr, true, FolderPlace::Sort},
    {kView, TrLater("Re&verse order"),      "",             TrLater("Sorts in descending order: latest, largest or last name first."), Needs::Nothing, ReverseOrder, nullptr, false, IsReversed, nullptr, false, FolderPlace::Sort},
    {kView, nullptr},
    {kView, TrLater("No gro&ups"),          "",             TrLater("Shows all files in one group."), Needs::Nothing, GroupBy<DateGrouping::None>, nullptr, false, IsGroupedBy<DateGrouping::None>, nullptr, true},
    {kView, TrLater("Group by da&y"),       "",             TrLater("Groups the files by the day they were taken or changed."), Needs::Nothing, GroupBy<DateGrouping::Day>, nullptr, false, IsGroupedBy<DateGrouping::Day>, nullptr, true},
    {kView, TrLater("Group by mo&nth"),     "",             TrLater("Groups the files by the month they were taken or changed."), Needs::Nothing, GroupBy<DateGrouping::Month>, nullptr, false, IsGroupedBy<DateGrouping::Month>, nullptr, true},
    {kView, TrLater("Group by year"),       "",             TrLater("Groups the files by the year they were taken or changed."), Needs::Nothing, GroupBy<DateGrouping::Year>, nullptr, false, IsGroupedBy<DateGrouping::Year>, nullptr, true},
    {kView, TrLater("Include subfolders"),  "",             TrLater("Lists the files in subfolders as well."), Needs::Nothing, ToggleSubfolders, nullptr, false, HasSubfolders},
    {kView, nullptr},
    {kView, TrLater("T&humbnails: disk-based"), "",         TrLater("Reads thumbnails from files beside the pictures."), Needs::Nothing, ThumbnailsFrom<choice::kDiskBased>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kDiskBased>, nullptr, true},
    {kView, TrLater("Thumbnails: &virtual"), "",            TrLater("Keeps thumbnails in memory only."), Needs::Nothing, ThumbnailsFrom<choice::kVirtual>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kVirtual>, nullptr, true},
    {kView, TrLater("Thumbnails: glo&bal database"), "",    TrLater("Reads thumbnails from the database in the data folder."), Needs::Nothing, ThumbnailsFrom<choice::kGlobalDatabase>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kGlobalDatabase>, nullptr, true},
    {kView, TrLater("Thumbnails: lo&cal database"), "",     TrLater("Reads thumbnails from the database in the folder."), Needs::Nothing, ThumbnailsFrom<choice::kLocalDatabase>, nullptr, false, Has<&BrowserModes::thumbnails, choice::kLocalDatabase>, nullptr, true},
    {kView, nullptr},
    {kView, TrLater("Detai&ls columns..."), "",      TrLater("Chooses the columns of the Details view."), Needs::Nothing, OfBrowser<&BrowserPage::ChooseColumns>},
    {kView, TrLater("&Folders"),            "F9",           TrLater("Shows or hides the folder tree."), Needs::Nothing, ToggleFolders, nullptr, false, HasFolders},
    {kView, TrLater("Side &pane"),          "F3",           TrLater("Shows or hides a preview and the facts of the focused picture."), Needs::Nothing, ToggleSide, nullptr, false, HasSide},
    {kView, TrLater("&Refresh"),            "F5",           TrLater("Reloads the folders."), Needs::Nothing, ReadFoldersAgain, nullptr, false, nullptr, nullptr, false, FolderPlace::Top},

    {kGo, TrLater("&Back"),                 "Alt+Left",     TrLater("Goes back to the previous folder."), Needs::Nothing, OfBrowser<&BrowserPage::GoBack>},
    {kGo, TrLater("&Forward"),              "Alt+Right",    TrLater("Goes forward to the next folder."), Needs::Nothing, OfBrowser<&BrowserPage::GoForward>},
    {kGo, TrLater("Visited f&olders..."), "Alt+Down",  TrLater("Lists the folders that this tab has shown."), Needs::Nothing, OfBrowser<&BrowserPage::OfferTrail>},
    {kGo, TrLater("&Parent folder"),        "Alt+Up",       TrLater("Goes to the parent folder."), Needs::Nothing, OfBrowser<&BrowserPage::GoUp>},
    {kGo, TrLater("&Enter a folder"),       "Ctrl+L",       TrLater("Lets you type the path of a folder."), Needs::Nothing, OfBrowser<&BrowserPage::EditPath>},
    {kGo, TrLater("F&avorite"),            "Ctrl+D",       TrLater("Adds this folder to the favorites at the top of the folder tree, or removes it."), Needs::Nothing, ToggleFavorite, nullptr, false, IsFavorite},
    {kGo, nullptr},
    {kGo, TrLater("&Next tab"),             "Ctrl+PageDown", TrLater("Switches to the next tab."), Needs::Nothing, NextTab, nullptr, false, nullptr, "Ctrl+Tab"},
    {kGo, TrLater("Pre&vious tab"),         "Ctrl+PageUp",  TrLater("Switches to the previous tab."), Needs::Nothing, PreviousTab, nullptr, false, nullptr, "Ctrl+Shift+Tab"},

    {kFunctions, TrLater("&View"),          "",             TrLater("Shows the focused picture in the view window."), Needs::Files, View<false>, "view", true},
    {kFunctions, TrLater("View in another &window"), "Ctrl+Return", TrLater("Shows the focused picture in a view window of its own."), Needs::Files, View<true>},
    {kFunctions, TrLater("Com&pare"),       "Ctrl+Shift+Return", TrLater("Shows two to four selected pictures side by side."), Needs::Few, CompareSelection, nullptr, true},
    {kFunctions, TrLater("&Convert..."),    "Ctrl+E",       TrLater("Converts the selected pictures to another format."), Needs::Files, ConvertSelection, "convert", true},
    {kFunctions, TrLater("Re&size..."),     "Ctrl+Shift+E", TrLater("Resizes the selected pictures to one of the sizes in Setup."), Needs::Files, ResizeSelection, nullptr, true},
    {kFunctions, TrLater("Edit..."),        "F4",           TrLater("Applies any operations to the selected pictures, with a preview."), Needs::Files, EditSelection, nullptr, true},
    {kFunctions, TrLater("Crop..."),        "Shift+F4",     TrLater("Crops the selected pictures, each with its own rectangle."), Needs::Files, CropSelection, "crop", true},
    {kFunctions, TrLater("Effects..."),     "",             TrLater("Changes colors and brightness of the selected pictures."), Needs::Files, EditWith<Family::Effects>, "effects"},
    {kFunctions, TrLater("Filter..."),      "",             TrLater("Blurs, sharpens or distorts the selected pictures."), Needs::Files, EditWith<Family::Filter>, "filter"},
    {kFunctions, TrLater("Transform..."),   "",             TrLater("Resizes, rotates or straightens the selected pictures."), Needs::Files, EditWith<Family::Transform>, "transform"},
    {kFunctions, TrLater("&Annotate..."),   "",             TrLater("Adds texts to the selected pictures."), Needs::Files, EditWith<Family::Annotate>, "annotate"},
    {kFunctions, TrLater("&Watermark..."),  "",             TrLater("Puts a text or a picture on top of the selected pictures."), Needs::Files, EditWith<Family::Watermark>, "watermark"},
    {kFunctions, TrLater("Matt..."),        "",             TrLater("Adds frames and borders to the selected pictures."), Needs::Files, EditWith<Family::Matt>, "matt"},
    {kFunctions, TrLater("Rotate &left"),   "Ctrl+Alt+L",   TrLater("Rotates the selected files; JPEG losslessly."), Needs::Files, Turn<Orientation::QuarterLeft>, nullptr, true},
    {kFunctions, TrLater("Rotate r&ight"),  "Ctrl+Alt+R",   TrLater("Rotates the selected files; JPEG losslessly."), Needs::Files, Turn<Orientation::QuarterRight>, nullptr, true},
    {kFunctions, TrLater("Print..."),       "",             TrLater("Prints the selected pictures, or saves them as PDF."), Needs::Files, Print, "print", true},
    {kFunctions, TrLater("Contact sheet..."), "",           TrLater("Puts the selected pictures on pages in a grid."), Needs::Files, MakeContactSheet},
    {kFunctions, TrLater("Catalog..."),     "",             TrLater("Puts the selected pictures on pages with details and a footer."), Needs::Files, MakeCatalog},
    {kFunctions, TrLater("Photo prints..."), "",            TrLater("Prints the selected pictures in exact sizes, packed on sheets."), Needs::Files, MakePhotoPrints},
    {kFunctions, TrLater("Poster..."),      "",             TrLater("Prints each selected picture over many sheets."), Needs::Files, MakePoster},
    {kFunctions, TrLater("Web gallery..."), "",             TrLater("Builds web pages with the selected pictures."), Needs::Files, MakeGallery},
    {kFunctions, TrLater("&Get info..."),   "Alt+Return",   TrLater("Shows information about the selected files."), Needs::Files, ShowInfo, "info", true},
    {kFunctions, TrLater("E&XIF..."),       "Alt+Shift+Return", TrLater("Shows the EXIF data of the focused picture."), Needs::Files, ShowExif, "exif", true},
    {kFunctions, TrLater("Remove metada&ta..."), "Ctrl+Alt+M", TrLater("Removes EXIF, GPS, comments and other metadata from the selected files."), Needs::Files, StripSelection, nullptr, true},
    {kFunctions, TrLater("Edit EXI&F..."),  "Ctrl+Alt+E",   TrLater("Changes EXIF values, times and places of the selected files."), Needs::Files, EditExifOfSelection, nullptr, true},
    {kFunctions, TrLater("File times..."),  "Ctrl+Alt+T",   TrLater("Sets the times of the selected files, for example to when they were taken."), Needs::Files, SetTimesOfSelection, nullptr, true},
    {kFunctions, nullptr},
    {kFunctions, TrLater("C&opy to..."),    "F7",           TrLater("Copies the selected files to a folder."), Needs::Item, CopySelectionTo, "copy", true},
    {kFunctions, TrLater("&Move to..."),    "F6",           TrLater("Moves the selected files to a folder."), Needs::Item, MoveSelectionTo, "move", true},
    {kFunctions, TrLater("&Rename..."),     "Shift+F2",     TrLater("Renames the selected files in sequence."), Needs::Files, RenameSelectionSequentially, "rename"},
    {kFunctions, TrLater("Create arc&hive..."), "Ctrl+Alt+Z",  TrLater("Archives the selected files and folders."), Needs::Item, ArchiveSelection, nullptr, true},
    {kFunctions, TrLater("&Delete"),        "Delete",       TrLater("Moves the selected files to the trash."), Needs::Item, TrashSelection, "trash", true},
    {kFunctions, TrLater("Delete perma&nently..."), "Shift+Delete", TrLater("Deletes the selected files; this cannot be undone."), Needs::Item, DeleteSelection},

    {kTags, TrLater("&1 star"),               "",             TrLater("Rates the selected files; key 1 in the list."), Needs::Files, TagAs<'1'>},
    {kTags, TrLater("&2 stars"),              "",             TrLater("Rates the selected files; key 2 in the list."), Needs::Files, TagAs<'2'>},
    {kTags, TrLater("&3 stars"),              "",             TrLater("Rates the selected files; key 3 in the list."), Needs::Files, TagAs<'3'>},
    {kTags, TrLater("&4 stars"),              "",             TrLater("Rates the selected files; key 4 in the list."), Needs::Files, TagAs<'4'>},
    {kTags, TrLater("&5 stars"),              "",             TrLater("Rates the selected files; key 5 in the list."), Needs::Files, TagAs<'5'>},
    {kTags, TrLater("N&o stars"),             "",             TrLater("Removes the rating; key 0 in the list."), Needs::Files, TagAs<'0'>},
    {kTags, TrLater("Re&jected"),             "",             TrLater("Marks the selected files as rejected."), Needs::Files, Reject},
    {kTags, nullptr},
    {kTags, TrLater("&Red"),                  "",             TrLater("Sets or removes the red label; key 6 in the list."), Needs::Files, TagAs<'6'>},
    {kTags, TrLater("&Yellow"),               "",             TrLater("Sets or removes the yellow label; key 7 in the list."), Needs::Files, TagAs<'7'>},
    {kTags, TrLater("&Green"),                "",             TrLater("Sets or removes the green label; key 8 in the list."), Needs::Files, TagAs<'8'>},
    {kTags, TrLater("&Blue"),                 "",             TrLater("Sets or removes the blue label; key 9 in the list."), Needs::Files, TagAs<'9'>},
    {kTags, TrLater("&Purple"),               "",             TrLater("Sets the purple label."), Needs::Files, TagPurple},
    {kTags, TrLater("&No label"),             "",             TrLater("Removes the color label."), Needs::Files, RemoveLabel},
    {kTags, nullptr},
    {kTags, TrLater("&Keywords..."),          "Ctrl+Shift+K", TrLater("Sets the keywords of the focused picture, or adds some to several."), Needs::Files, KeywordSelection},
    {kTags, TrLater("Co&mment..."),           "Ctrl+M",       TrLater("Sets the description of the selected pictures."), Needs::Files, CommentSelection},

    {kTools, TrLater("Find si&milar..."),     "Ctrl+Shift+S", TrLater("Finds similar pictures in the selected folders, or in this one."), Needs::Nothing, FindSimilarInBrowser},
    {kTools, TrLater("File &history..."),     "Ctrl+H",       TrLater("Lists recently used files."), Needs::Nothing, ShowFileHistory, "history"},
    {kTools, TrLater("&Archive manager..."),  "Ctrl+Alt+A",   TrLater("Lists the selected archive, extracts from it and adds to it."), Needs::Nothing, ManageArchive},
    {kTools, TrLater("Compact &database..."), "",             TrLater("Removes deleted records from a thumbnail database."), Needs::Nothing, ShowCompaction},
    {kTools, TrLater("Clean up &thumbnails..."), "",          TrLater("Deletes thumbnail files without a picture."), Needs::Nothing, ShowCleanUp},
    {kTools, TrLater("&Plug-ins..."),         "",             TrLater("Lists the plug-in formats and opens their settings."), Needs::Nothing, ShowPlugins},
    {kTools, TrLater("Tool&bar..."),          "",             TrLater("Chooses the toolbar buttons and their order."), Needs::Nothing, ChooseToolbar},
    {kTools, nullptr},
    {kTools, TrLater("&Setup..."),            "Ctrl+,",       TrLater("Shows all settings."), Needs::Nothing, ShowSetup, "setup"},

    {kHelp, TrLater("&Find command..."),      "Ctrl+K",       TrLater("Finds a command by name."), Needs::Nothing, FindCommand},
    {kHelp, TrLater("&Manual"),               "F1",           TrLater("Describes the windows and their keyboard shortcuts."), Needs::Nothing, ShowManual},
    {kHelp, TrLater("&Configuration"),        "",             TrLater("Describes how settings are stored."), Needs::Nothing, ShowConfigurationHelp},
    {kHelp, nullptr},
    {kHelp, TrLater("&About..."),             "",             TrLater("Shows the version of the program, and its libraries with their licenses."), Needs::Nothing, ShowAbout},
};
// clang-format on

// What changes the selected files or their folder; not for files unpacked from an archive.
constexpr void (*kChanging[])(Shell&) = {
    Cut, Paste, NewFolder, OfBrowser<&BrowserPage::EditFocusedName>, Turn<Orientation::QuarterLeft>,
    Turn<Orientation::QuarterRight>, StripSelection, EditExifOfSelection, SetTimesOfSelection,
    MoveSelectionTo, RenameSelectionSequentially, TrashSelection, DeleteSelection, TagAs<'1'>,
    TagAs<'2'>, TagAs<'3'>, TagAs<'4'>, TagAs<'5'>, TagAs<'0'>, Reject, TagAs<'6'>, TagAs<'7'>,
    TagAs<'8'>, TagAs<'9'>, TagPurple, RemoveLabel, KeywordSelection, CommentSelection};

bool IsRefusedInArchive(const Command& command, Shell& shell) {
  return std::ranges::find(kChanging, command.run) != std::end(kChanging) &&
         !ArchiveOfFolder(shell.Tabs().CurrentFolder()).empty();
}

}  // namespace

std::span<const Command> Commands() { return kCommands; }

namespace {

// Menus and texts without mnemonics and dots: "File/Open".
std::string NameOf(const Command& command) {
  std::string name = std::string(command.menu) + "/" + command.text;
  std::erase(name, '&');
  std::erase(name, '.');
  return name;
}

KeyedCommand KeyedOf(const Command& command) {
  const wxString label = wxControl::RemoveMnemonics(Label(command.menu)) + ": " +
                         wxControl::RemoveMnemonics(Label(command.text));
  return {NameOf(command), Utf8(label), command.accelerator};
}

}  // namespace

std::vector<KeyedCommand> KeyedCommands() {
  std::vector<KeyedCommand> commands;
  for (const Command& command : kCommands) {
    if (command.text != nullptr) commands.push_back(KeyedOf(command));
  }
  return commands;
}

std::string KeyOf(const Command& command) {
  return UserKeys().KeyOf({NameOf(command), {}, command.accelerator});
}

const Command& CommandOfId(int id) { return kCommands[id - kFirstCommandId]; }

bool IsCommandId(int id) {
  return id >= kFirstCommandId && id < kFirstCommandId + static_cast<int>(std::size(kCommands));
}

const Command& JumpCommand() { return *std::ranges::find(kCommands, &Jump, &Command::run); }

bool CanRun(const Command& command, Shell& shell) {
  if (IsRefusedInArchive(command, shell)) return false;
  const BrowserPage* browser = shell.Tabs().Front();
  switch (command.needs) {
    case Needs::Files: return browser != nullptr && browser->Model().HasFileForFunction();
    case Needs::Few:
      return browser != nullptr &&
             CompareFrame::CanShow(browser->Model().Selected().SelectedCount());
    case Needs::Item: return browser != nullptr && browser->Model().HasPathForFunction();
    case Needs::ClosedTab: return shell.Tabs().HasClosed();
    case Needs::Undo: return shell.Files().Undoable().CanUndo() && !shell.Files().Busy();
    case Needs::Redo: return shell.Files().Undoable().CanRedo() && !shell.Files().Busy();
    case Needs::Nothing: break;
  }
  return true;
}

const char* WhyNot(const Command& command, Shell& shell) {
  if (IsRefusedInArchive(command, shell)) return kUnpackedFilesStay;
  switch (command.needs) {
    case Needs::Files: return TrLater("No picture is selected.");
    case Needs::Few: return TrLater("Select two to four pictures.");
    case Needs::Item: return TrLater("No file or folder is selected.");
    case Needs::Undo: return TrLater("There is nothing to undo.");
    case Needs::Redo: return TrLater("There is nothing to redo.");
    case Needs::ClosedTab: return TrLater("There is no closed tab.");
    case Needs::Nothing: break;
  }
  return "";
}

std::string ButtonNameOf(const Command& command) {
  return command.symbol != nullptr ? command.symbol : NameOf(command);
}

const Command* CommandOfButton(std::string_view name) {
  const auto has = [name](const Command& command) {
    return command.text != nullptr && ButtonNameOf(command) == name;
  };
  const auto* const found = std::ranges::find_if(kCommands, has);
  return found == std::end(kCommands) ? nullptr : found;
}

}  // namespace fotomill::desktop
