#pragma once

#include <wx/fswatcher.h>
#include <wx/panel.h>
#include <wx/timer.h>

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "desktop/browser_model.h"
#include "desktop/thumbnail_offer.h"
#include "desktop/windows/thumbnail_service.h"

class wxBitmapButton;
class wxSearchCtrl;
class wxSimplebook;
class wxTextCtrl;

namespace fotomill::desktop {

class DetailsList;
class ThumbnailCanvas;
class UpdateBar;

// What a browser asks of its frame.
class BrowserHost {
 public:
  virtual ~BrowserHost() = default;
  virtual void BrowserChanged() = 0;  // folder, selection, modes or counts
  virtual void ViewFile(const std::string& path) = 0;
  virtual void ShowContextMenu(wxWindow& window, const wxPoint& place, bool onFile) = 0;
  virtual void RenameFile(const std::string& path, const std::string& name) = 0;
  virtual void DropFiles(const std::vector<std::string>& files, const std::string& folder, bool move) = 0;
};

// One browser: the contents of a tab. Shows a folder as thumbnails, names or details.
class BrowserPage : public wxPanel {
 public:
  BrowserPage(wxWindow* parent, BrowserHost& host, ThumbnailService& thumbnails, const BrowserModes& modes);
  ~BrowserPage() override;

  // Goes to a folder; `focus` is the name that gets the focus once it is listed. Kept in the history unless `fromHistory`.
  void Open(const std::string& folder, const std::string& focus = {}, bool fromHistory = false);
  void Reload();
  void GoBack();
  void GoForward();
  void GoUp();
  bool CanGoBack() const { return historyPlace_ > 0; }
  bool CanGoForward() const { return historyPlace_ + 1 < history_.size(); }

  const BrowserModel& Model() const { return model_; }
  BrowserModel& Model() { return model_; }
  void SetViewMode(int32_t view);
  void SetThumbnailMode(int32_t mode);
  void SetSort(int32_t sort, bool descending);
  // Next larger or smaller way of showing thumbnails.
  void ChangeSize(int steps);
  // Shows the selection as the model has it now.
  void SelectionChanged();
  // Focus on the line of a name, scrolled into view.
  void FocusName(const std::string& name);
  void EditFocusedName();
  void EditPath();
  void EditFilter();
  // This browser comes to the front.
  void Activated();
  void FocusList();
  bool Listing() const { return listing_; }
  size_t MissingThumbnails() const;
  int64_t Scroll() const;
  // Scrolled so far once the folder is listed.
  void RestoreScroll(int64_t scroll) { wantedScroll_ = scroll; }

 private:
  void BuildPathBar();
  void StartListing();
  void StopListing();
  void TakeListing(FolderListing listing, bool complete);
  void StartFacts();
  void TakeFacts(const std::vector<std::pair<size_t, FolderItem>>& facts, bool last);
  bool NeedsFacts() const;
  bool ShowsDetails() const;
  void ShowView();
  void SetModes(const BrowserModes& modes);
  void ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results);
  void Activate(size_t line);
  void BeginDrag();
  void Watch();
  void ApplyFilter();
  void OfferThumbnails();
  void StopOffer();
  void ShowUpdateBar(bool show);

  BrowserHost& host_;
  ThumbnailService& thumbnails_;
  BrowserModel model_;
  std::vector<std::string> history_;
  size_t historyPlace_ = 0;
  std::string wantedFocus_;
  int64_t wantedScroll_ = -1;

  bool listing_ = false;
  struct Job {
    std::atomic<bool> stop{false};
  };
  std::shared_ptr<Job> job_;       // of the latest listing
  std::shared_ptr<Job> factsJob_;  // reads headers for columns and orders that need them
  std::unique_ptr<wxFileSystemWatcher> watcher_;
  wxTimer reloadTimer_;
  std::shared_ptr<ThumbnailOffer> offer_;  // of this folder
  bool offered_ = false;
  bool asksForUpdates_ = true;  // until the user wants no more offers here
  int64_t lastCompaction_ = 0;

  wxBitmapButton* back_ = nullptr;
  wxBitmapButton* forward_ = nullptr;
  wxTextCtrl* path_ = nullptr;
  wxSearchCtrl* filter_ = nullptr;
  UpdateBar* updateBar_ = nullptr;
  wxSimplebook* views_ = nullptr;
  ThumbnailCanvas* canvas_ = nullptr;
  DetailsList* details_ = nullptr;
};

}  // namespace fotomill::desktop
