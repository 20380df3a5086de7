#pragma once

#include <wx/panel.h>

#include <string>
#include <vector>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/detail_columns.h"
#include "desktop/models/browser/folder_trail.h"
#include "desktop/windows/browser/folder_reader.h"
#include "desktop/windows/browser/folder_watch.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "desktop/windows/browser/update_offer.h"

class wxSearchCtrl;
class wxSimplebook;

namespace fotomill::desktop {

class DetailsList;
class PathBar;
class ThumbnailCanvas;

// What a browser asks of its frame.
class BrowserHost {
 public:
  virtual ~BrowserHost() = default;
  virtual void BrowserChanged() = 0;     // folder, selection, modes or counts
  virtual DetailColumns& Columns() = 0;  // of the details of all browsers
  // How the user wants the folder shown from now on.
  virtual void KeepView(const std::string& folder, const FolderView& view) = 0;
  virtual const FolderViews& Views() = 0;  // how folders are to be shown
  // What the user did to files of the browser: the frame does it.
  virtual void ViewFile(const std::string& path) = 0;
  // `onFile`: of the selection, else of the folder.
  virtual void ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) = 0;
  // `name` without a folder.
  virtual void RenameFile(const std::string& path, const std::string& name) = 0;
  // `move`: else they are copied.
  virtual void DropFiles(const std::vector<std::string>& files, const std::string& folder,
                         bool move) = 0;
};

// One browser: the contents of a tab. Shows a folder as thumbnails, names or details.
class BrowserPage : public wxPanel {
 public:
  // Host and thumbnails must outlive it.
  BrowserPage(wxWindow* parent, BrowserHost& host, ThumbnailService& thumbnails,
              const FolderView& view);

  // Goes to a folder; `focus` is the name that gets the focus once it is listed.
  void Open(const std::string& folder, const std::string& focus = {});
  void Reload();  // reads the folder again; the selection stays with its names
  // Goes back, or ahead, to folders that this browser showed.
  void StepAlongTrail(int steps);
  void GoBack() { StepAlongTrail(-1); }    // nothing at the beginning of the trail
  void GoForward() { StepAlongTrail(1); }  // nothing at its end
  void GoUp();  // to the parent folder

  // What the browser shows. After changing its selection, call SelectionChanged.
  const BrowserModel& Model() const { return model_; }
  BrowserModel& Model() { return model_; }
  // By choice::ViewMode, choice::ThumbnailMode and choice::SortMode; the folder's view is kept as
  // well.
  void SetViewMode(int32_t mode);
  void SetThumbnailMode(int32_t mode);          // reads them anew, from there
  void SetSort(int32_t sort, bool descending);  // the selection stays with its files
  // Next larger or smaller way of showing thumbnails.
  void ChangeSize(int steps);
  // Shows the selection as the model has it now.
  void SelectionChanged();
  // Focus on the line of a name, scrolled into view.
  void FocusName(const std::string& name);
  void EditFocusedName();  // in place, in the list
  void EditPath();         // the keyboard goes to the path, all of it selected
  void OfferTrail();  // the folders to go back to, as a menu
  void EditFilter();  // the keyboard goes to the filter
  // Lets the user choose the columns of the details, which are then shown.
  void ChooseColumns();
  // Takes down how the columns are arranged here.
  void KeepColumns();
  // This browser comes to the front.
  void Activated();
  void FocusList();  // the keyboard goes to the list
  bool Listing() const { return reader_.Listing(); }  // the folder is still being read
  size_t MissingThumbnails() const;                   // of the pictures shown
  int64_t Scroll() const;  // pixels
  // Scrolled so far once the folder is listed.
  void RestoreScroll(int64_t scroll) { wantedScroll_ = scroll; }
  // Whether this browser offers to make missing thumbnails.
  bool AsksForThumbnails() const { return offer_.Asks(); }
  void SetAsksForThumbnails(bool asks) { offer_.SetAsks(asks); }

 private:
  void BuildFilter();
  void BuildViews();
  void ShowFolder(const std::string& folder, const std::string& focus);
  void ShowListing(FolderListing listing, bool complete);
  void OfferThumbnails();
  void StartFacts();
  void ShowFacts(const PlacedItems& found, bool last);
  bool NeedsFacts() const;
  bool ShowsDetails() const;
  void ShowView();
  void ShowLines();
  void UseViewOf(const std::string& folder);
  void TakeChangedOverride();
  void ShowAs(const FolderView& view);
  void ChooseView(const FolderView& view);
  void ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results);
  void Activate(size_t line);
  void BeginDrag();
  void ApplyFilter();
  void LeaveBar();

  BrowserHost& host_;
  ThumbnailService& thumbnails_;
  BrowserModel model_;
  FolderView base_;  // of folders of which nothing is kept
  BrowserModes override_;  // what the folder's own file says; -1: nothing
  FolderTrail trail_;
  std::string wantedFocus_;
  int64_t wantedScroll_ = -1;
  FolderReader reader_;
  FolderWatch watch_;
  UpdateOffer offer_;

  PathBar* path_ = nullptr;
  wxSearchCtrl* filter_ = nullptr;
  wxSimplebook* views_ = nullptr;
  ThumbnailCanvas* canvas_ = nullptr;
  DetailsList* details_ = nullptr;
};

}  // namespace fotomill::desktop
