#pragma once

#include <wx/panel.h>
#include <wx/timer.h>

#include <optional>
#include <string>
#include <vector>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/detail_columns.h"
#include "desktop/models/browser/folder_trail.h"
#include "desktop/windows/browser/folder_reader.h"
#include "desktop/windows/browser/folder_watch.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "desktop/windows/browser/update_offer.h"

class wxSimplebook;

namespace fotomill::desktop {

class BrowserBar;
class DetailsList;
struct DraggedFiles;
class FolderNote;
class FolderProblem;
class ThumbnailCanvas;

class BrowserPage;

// What a browser needs from its frame.
class BrowserHost {
 public:
  virtual ~BrowserHost() = default;
  virtual void BrowserChanged() = 0;     // folder, selection, modes or counts
  virtual void CloseBrowser(BrowserPage& browser) = 0;  // its folder no longer exists
  virtual DetailColumns& Columns() = 0;  // of the details view in all browsers
  // Saves the view chosen for a folder.
  virtual void KeepView(const std::string& folder, const FolderView& view) = 0;
  virtual const FolderViews& Views() = 0;  // saved views of folders
  // What users must know about a folder before they change its files; usually empty.
  virtual std::string NoteAbout(const std::string& folder) const = 0;
  // Actions on files of the browser, performed by the frame.
  virtual void ViewFile(const std::string& path) = 0;
  // `onFile`: for the selection, otherwise for the folder.
  virtual void ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) = 0;
  // `name` without a folder.
  virtual void RenameFile(const std::string& path, const std::string& name) = 0;
  // `move`: move instead of copying.
  virtual void DropFiles(const std::vector<std::string>& files, const std::string& folder,
                         bool move) = 0;
  // Changes the tags of the selected files.
  virtual void TagSelected(const TagChanges& changes) = 0;
};

// A browser, the contents of a tab. Shows a folder as thumbnails, names or details.
class BrowserPage : public wxPanel {
 public:
  // `host` and `thumbnails` must outlive this object.
  BrowserPage(wxWindow* parent, BrowserHost& host, ThumbnailService& thumbnails,
              const FolderView& view);

  // Opens a folder; `focus` is the name to focus once it is listed.
  void Open(const std::string& folder, const std::string& focus = {});
  // Shows only these files, by names relative to the folder, until a folder is opened.
  void ShowFound(const std::string& folder, const std::vector<std::string>& names,
                 const FolderView& view);
  bool ShowsFound() const { return found_.has_value(); }
  // Updates the names of found files after one was renamed; absolute paths.
  void FollowRename(const std::string& from, const std::string& to);
  void Reload();  // reads the folder again, keeping the selection by name
  // Moves along the visited folders of this browser.
  void StepAlongTrail(int steps);
  void GoBack() { StepAlongTrail(-1); }    // does nothing at the start
  void GoForward() { StepAlongTrail(1); }  // does nothing at the end
  void GoUp();  // to the parent folder

  // The contents of the browser. After changing the selection, call SelectionChanged.
  const BrowserModel& Model() const { return model_; }
  BrowserModel& Model() { return model_; }
  // Values of choice::ViewMode, choice::ThumbnailMode and choice::SortMode; also saves the view of
  // the folder.
  void SetViewMode(int32_t mode);
  void SetThumbnailMode(int32_t mode);          // reloads the thumbnails
  void SetSort(int32_t sort, bool descending);  // keeps the selected files
  // Changes to the next larger or smaller thumbnails.
  void ChangeSize(int steps);
  // The edge of thumbnails, device-independent; changes the view to one that has it.
  void SetSide(int32_t side);
  void SetGrouping(DateGrouping grouping);
  // Whether the files in subfolders are listed as well, until another folder is opened.
  void ShowSubfolders(bool show);
  bool ShowsSubfolders() const { return subfolders_; }
  // Updates the display of the model's selection.
  void SelectionChanged();
  // Focuses the line with this name and scrolls it into view.
  void FocusName(const std::string& name);
  // Scrolls to the line with this name, keeping focus and selection; thumbnails only.
  void ShowInList(const std::string& name);
  // Selects exactly these names once the folder is listed again, and nothing until then. For
  // commands that just changed the files.
  void SelectWhenListed(std::vector<std::string> names);
  void FocusPath(const std::string& path);  // of a file
  void EditFocusedName();  // in the list
  void EditPath();         // focuses the path and selects its text
  void OfferTrail();  // shows a menu of visited folders
  void EditFilter();  // focuses the filter
  // Changes the tags of the selected files by a digit key; false for other keys.
  bool TagByKey(int key);
  // The tags of files were changed, by path, or those of their sidecars.
  void TagsChanged(const std::vector<std::string>& paths);
  // Lets the user choose the columns of the details view.
  void ChooseColumns();
  // Stores the current arrangement of columns.
  void KeepColumns();
  // Call when this browser becomes active.
  void Activated();
  void FocusList();  // focuses the list
  bool Listing() const { return reader_.Listing(); }  // the folder is being read
  size_t MissingThumbnails() const;                   // among the pictures shown
  int64_t Scroll() const;  // pixels
  bool FocusInSight() const;  // the focused file is visible
  // Sets the scroll position to restore after listing.
  void RestoreScroll(int64_t scroll) { wantedScroll_ = scroll; }
  // Call after Open: this browser is closed if the folder no longer exists.
  void CloseIfMissing() { closesIfMissing_ = true; }
  // Whether this browser offers to create missing thumbnail files; it asks only once.
  bool AsksForThumbnails() const { return offer_.Asks(); }
  void SetAsksForThumbnails(bool asks) { offer_.SetAsks(asks); }

 private:
  void BuildViews();
  void ShowFolder(const std::string& folder, const std::string& focus);
  void EnterFolder(const std::string& folder);
  void ShowEntered();
  void ShowListing(FolderListing listing, bool complete);
  void ShowWanted(bool first);
  void ShowProblem(const std::string& problem);
  void OfferThumbnails();
  void StartFacts();
  void StartTags();
  void ShowTags(const PlacedItems& found, bool last);
  void ShowFacts(const PlacedItems& found, bool last);
  bool ShowsDetails() const;
  void ShowView();
  void ShowLines();
  void UseView(const BrowserModes& chosen);
  void ShowAs(const FolderView& view);
  void ChooseView(const FolderView& view);
  void ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results);
  void Activate(size_t line);
  std::string FolderAt(const wxPoint& place) const;
  DraggedFiles FilesToDrag() const;
  void BeginDrag();

  BrowserHost& host_;
  ThumbnailService& thumbnails_;
  BrowserModel model_;
  FolderView base_;  // for folders without saved view
  BrowserModes override_;  // from the folder's own file; -1: none
  FolderTrail trail_;
  std::optional<std::vector<std::string>> found_;  // the files to show; none: the folder
  bool subfolders_ = false;
  bool factsRead_ = false;  // those of the current listing, as far as possible
  std::string wantedFocus_;
  int64_t wantedScroll_ = -1;
  std::optional<std::vector<std::string>> wantedNames_;  // to select
  bool closesIfMissing_ = false;
  FolderReader reader_;
  wxTimer late_;  // until the page says that the folder does not answer
  FolderWatch watch_;
  UpdateOffer offer_;

  BrowserBar* bar_ = nullptr;
  wxSimplebook* views_ = nullptr;
  FolderProblem* problem_ = nullptr;  // shown instead of the views
  FolderNote* note_ = nullptr;
  ThumbnailCanvas* canvas_ = nullptr;
  DetailsList* details_ = nullptr;
};

}  // namespace fotomill::desktop
