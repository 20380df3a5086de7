#pragma once

#include <wx/string.h>
#include <wx/timer.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/browser/detail_columns.h"
#include "desktop/models/browser/folder_views.h"
#include "desktop/models/shell/closed_tabs.h"
#include "desktop/models/shell/session.h"
#include "desktop/windows/browser/browser_page.h"

class wxAuiNotebook;
class wxAuiNotebookEvent;

namespace fotomill::desktop {

class FrameMenus;
class Shell;

// The browsers of the frame, one per tab, and shared data: columns of the details view and views of
// folders.
class BrowserTabs : private BrowserHost {
 public:
  // `changed` is called when another browser becomes current, or when the current one changes its
  // folder, selection, mode or count.
  BrowserTabs(wxWindow* parent, Shell& shell, FrameMenus& menus, std::function<void()> changed);

  wxWindow& Window() const;

  // The current browser; not null once a folder was opened.
  BrowserPage* Front() const;
  // Input for functions: files selected in the current browser, in list order, or else the focused
  // one.
  std::vector<std::string> SelectedFiles() const;
  // The same including folders.
  std::vector<std::string> SelectedPaths() const;
  std::string CurrentFolder() const;  // of the current browser
  // Selects those files that the current browser shows.
  void SelectFiles(const std::vector<std::string>& files);
  // Selects exactly these files in all browsers of their folders once those are listed again, and
  // nothing until then. Call before FilesChanged.
  void SelectWhenListed(const std::vector<std::string>& files);

  BrowserPage* Open(const std::string& folder);  // in a new tab, which becomes current
  // The tab with this folder, or a new one.
  BrowserPage* Show(const std::string& folder);
  // Shows found files, by names relative to the folder, in `page`, or if it is null in a new tab.
  // The tab becomes current.
  BrowserPage* ShowFound(const std::string& folder, const std::vector<std::string>& names,
                         const FolderView& view, BrowserPage* page);
  // A tab with found files; null if there is none.
  BrowserPage* FoundPage() const;
  // Closes the current tab, unless it is the last one.
  void Close();
  bool HasClosed() const { return !closed_.Empty(); }  // a tab can be reopened
  void Reopen();
  // Moves `step` tabs forward or back, wrapping around.
  void Step(int step);

  // Reloads the folders of all browsers.
  void Reload();
  // The tags of pictures changed in these files, pictures or sidecars.
  void TagsChanged(const std::vector<std::string>& paths);
  // Updates browsers of the folder and its subfolders.
  void FollowRename(const std::string& from, const std::string& to);

  // Opens the tabs of a session in addition to the open tabs, or instead of them.
  void Restore(const Session& session);
  void Replace(const Session& session);
  // Stores tabs and columns in a session, and writes the views of folders to their file.
  void Keep(Session& session);
  void SetColumns(const std::string& text) { columns_ = ParseDetailColumns(text); }

 private:
  // BrowserHost
  void BrowserChanged() override;
  void CloseBrowser(BrowserPage& browser) override;
  DetailColumns& Columns() override { return columns_; }
  void KeepView(const std::string& folder, const FolderView& view) override;
  const FolderViews& Views() override { return views_; }
  std::string NoteAbout(const std::string& folder) const override;
  void ViewFile(const std::string& path) override;
  void ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) override;
  void RenameFile(const std::string& path, const std::string& name) override;
  void DropFiles(const std::vector<std::string>& files, const std::string& folder,
                 bool move) override;
  void TagSelected(const TagChanges& changes) override;

  BrowserPage* PageAt(size_t tab) const;
  void OnTabChanged(wxAuiNotebookEvent& event);
  void ShowStrip();
  void LogState();

  Shell& shell_;
  FrameMenus& menus_;
  const std::function<void()> changed_;
  wxAuiNotebook* book_ = nullptr;
  int stripHeight_ = -1;  // as the notebook takes it: 0 hides the tabs
  FolderViews views_;
  wxTimer viewsTimer_;  // delay before writing views
  DetailColumns columns_ = ParseDetailColumns({});
  ClosedTabs closed_;
  std::string loggedState_;
};

// The name of a folder for its tab and the frame's title.
wxString FolderLabel(const std::string& folder);

}  // namespace fotomill::desktop
