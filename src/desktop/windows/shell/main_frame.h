#pragma once

#include <wx/frame.h>
#include <wx/weakref.h>

#include <string>
#include <vector>

#include "catalog/history/file_history.h"
#include "desktop/models/shell/favourites.h"
#include "desktop/models/shell/session.h"
#include "desktop/windows/browser/browser_page.h"
#include "desktop/windows/browser/thumbnail_service.h"

class wxAuiNotebook;
class wxAuiNotebookEvent;
class wxSplitterWindow;

namespace fotomill::desktop {

class BatchRunner;
class FileActions;
class FolderTree;
class ViewFrame;
struct Command;

// The program's window: a tab for each browser, the folders at the left, menus and toolbar from the table of commands.
class MainFrame : public wxFrame, public BrowserHost {
 public:
  MainFrame();
  ~MainFrame() override;

  // The browser in front; there is always one once a folder was opened.
  BrowserPage* Browser() const;
  // What functions work on: files selected in the browser in front, in list order, or else the focused one.
  std::vector<std::string> SelectedFiles() const;
  // The same with folders.
  std::vector<std::string> SelectedPaths() const;
  std::string CurrentFolder() const;

  BrowserPage* OpenTab(const std::string& folder);
  // The tab that shows the folder, or another one.
  BrowserPage* ShowFolder(const std::string& folder);
  // Size and place of the last run; its tabs are opened later.
  void RestorePlace();
  void CloseTab();
  void ReopenTab();
  // Named sets of tabs.
  void SaveTabSet();
  void OpenTabSet();
  void StepTab(int step);
  void ChooseToolbar();
  bool HasClosedTab() const { return !closedTabs_.empty(); }
  void ShowFolders(bool show);
  bool FoldersShown() const;
  ThumbnailService& Thumbnails() { return thumbnails_; }
  BatchRunner& Batches() { return *batches_; }
  FileActions& Files() { return *files_; }

  // Selects the files that the browser in front shows.
  void SelectFiles(const std::vector<std::string>& files);
  // The folder is put among the favourites, or taken out.
  void ToggleFavourite(const std::string& folder);
  bool IsFavourite(const std::string& folder) const { return favourites_.Has(folder); }
  // A folder may have got another name: what shows it, or lies in it, goes on under that one.
  void FollowRename(const std::string& from, const std::string& to);
  // Files were written, renamed or deleted: browsers look again.
  void FilesChanged();
  // For the file history, which is written when nothing else is to be done.
  void NoteUses(const std::vector<FileUse>& uses);
  void FlushUses();

  // What the program was started with, a folder or a file: shows it. A file is shown at once and its folder listed
  // afterwards; the tabs of the last time are opened with it when `restore`. Nothing: the tabs of the last time or a folder.
  void OpenStart(const std::string& path, bool restore);
  // Opens a view window on a file, with the files of `list` as its neighbours.
  ViewFrame* ViewFiles(const std::vector<std::string>& list, const std::string& file);
  // Settings have changed: every window shows what they say now.
  void SettingsChanged();
  // A line in the status bar.
  void Tell(const std::string& text);

  // BrowserHost
  void BrowserChanged() override;
  DetailColumns& Columns() override { return columns_; }
  void KeepView(const std::string& folder, const FolderView& view) override;
  const FolderViews& Views() override { return views_; }
  void ViewFile(const std::string& path) override;
  void ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) override;
  void RenameFile(const std::string& path, const std::string& name) override;
  void DropFiles(const std::vector<std::string>& files, const std::string& folder, bool move) override;

 private:
  // The tabs of the last run, where they are to be remembered. False when there are none.
  bool RestoreTabs();
  void BuildMenus();
  void BuildToolbar();
  void FillToolbar();
  void BuildPanes();
  void ShowTip(const Command& command);
  bool Enabled(const Command& command) const;
  void OnTabChanged(wxAuiNotebookEvent& event);
  void OnClose(wxCloseEvent& event);
  void LogState();
  void OpenTabs(const Session& session);
  // Writes the tabs, or none, and the frame's size to the set in use. False when that could not be done.
  [[nodiscard]] bool KeepSession(bool withTabs);
  void NoteClosed(size_t tab);
  BrowserPage* PageAt(size_t tab) const;

  ThumbnailService thumbnails_;
  FolderViews views_;
  DetailColumns columns_ = ParseDetailColumns({});
  Favourites favourites_;
  wxSplitterWindow* splitter_ = nullptr;
  FolderTree* tree_ = nullptr;
  wxAuiNotebook* tabs_ = nullptr;
  Session lastTabs_;                     // of the last run, as long as they are not open
  std::vector<std::string> closedTabs_;  // folders, the latest last
  std::string loggedState_;
  wxWeakRef<ViewFrame> wantsList_;  // shows a file whose folder is being listed
  std::vector<FileUse> uses_;
  wxTimer usesTimer_;
  std::unique_ptr<BatchRunner> batches_;
  std::unique_ptr<FileActions> files_;
};

}  // namespace fotomill::desktop
