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

// The browsers of the frame, a tab each, and what they share: the columns of the details and how
// folders are shown.
class BrowserTabs : private BrowserHost {
 public:
  // `changed` is called when the browser in front has another folder, selection, mode or count, or
  // is another one.
  BrowserTabs(wxWindow* parent, Shell& shell, FrameMenus& menus, std::function<void()> changed);

  wxWindow& Window() const;

  // The browser in front; there is always one once a folder was opened.
  BrowserPage* Front() const;
  // What functions work on: files selected in the browser in front, in list order, or else the
  // focused one.
  std::vector<std::string> SelectedFiles() const;
  // The same with folders.
  std::vector<std::string> SelectedPaths() const;
  std::string CurrentFolder() const;  // of the browser in front
  // Selects those of the files that the browser in front shows.
  void SelectFiles(const std::vector<std::string>& files);

  BrowserPage* Open(const std::string& folder);  // in a new tab, which comes to the front
  // The tab that shows the folder, or a new one.
  BrowserPage* Show(const std::string& folder);
  // The tab in front, unless it is the last one.
  void Close();
  bool HasClosed() const { return !closed_.Empty(); }  // there is a tab to reopen
  void Reopen();
  // Goes `step` tabs on, or back, round about.
  void Step(int step);

  // Every browser reads its folder again.
  void Reload();
  // Browsers of the folder, or of one below, go with it.
  void FollowRename(const std::string& from, const std::string& to);

  // Opens the tabs of a session behind those that are open, or in their place.
  void Restore(const Session& session);
  void Replace(const Session& session);
  // Writes the tabs and the columns into a session, and how folders are shown to its file.
  void Keep(Session& session);
  void SetColumns(const std::string& text) { columns_ = ParseDetailColumns(text); }

 private:
  // BrowserHost
  void BrowserChanged() override;
  DetailColumns& Columns() override { return columns_; }
  void KeepView(const std::string& folder, const FolderView& view) override;
  const FolderViews& Views() override { return views_; }
  void ViewFile(const std::string& path) override;
  void ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) override;
  void RenameFile(const std::string& path, const std::string& name) override;
  void DropFiles(const std::vector<std::string>& files, const std::string& folder,
                 bool move) override;

  BrowserPage* PageAt(size_t tab) const;
  void OnTabChanged(wxAuiNotebookEvent& event);
  void LogState();

  Shell& shell_;
  FrameMenus& menus_;
  const std::function<void()> changed_;
  wxAuiNotebook* book_ = nullptr;
  FolderViews views_;
  wxTimer viewsTimer_;  // until they are written
  DetailColumns columns_ = ParseDetailColumns({});
  ClosedTabs closed_;
  std::string loggedState_;
};

// The name of a folder on its tab and in the frame's title.
wxString FolderLabel(const std::string& folder);

}  // namespace fotomill::desktop
