#pragma once

#include <wx/panel.h>

#include <cstdint>
#include <functional>
#include <string>

class wxBitmapButton;
class wxButton;
class wxSearchCtrl;
class wxSlider;

namespace fotomill::desktop {

class BrowserModel;
class FolderTrail;
class PathBar;

// The bar above the files of a browser: its path, the filters by tags and by name, the order of the
// files, and the size of the thumbnails. Filters take effect in the model at once.
class BrowserBar : public wxPanel {
 public:
  // User actions.
  struct Events {
    std::function<void(int steps)> step;  // back or forward in the trail
    std::function<void()> up;
    std::function<void(const std::string& folder)> open;  // an existing folder
    // a choice::SortMode and its direction
    std::function<void(int32_t mode, bool descending)> sort;
    std::function<void(int32_t side)> resize;             // edge of thumbnails
    std::function<void()> filtered;                       // the model has other lines
    std::function<void()> left;                           // the list gets the focus
  };
  // `model` and `trail` belong to the browser and must outlive the bar.
  BrowserBar(wxWindow* parent, BrowserModel& model, const FolderTrail& trail, Events events);

  // The browser's folder has changed: updates the path and empties the filter.
  void ShowFolder(const std::string& folder);
  // Updates order and size to the model's view.
  void ShowView();
  void EditPath();    // focuses the path and selects its text
  void OfferTrail();  // shows a menu of visited folders
  void EditFilter();  // focuses the filter

 private:
  void BuildTagFilter();
  void BuildFilter();
  void BuildOrder();
  void BuildSlider();
  void ChooseTagFilter();
  void ChooseOrder();
  void ShowDirection();
  void Leave();

  BrowserModel& model_;
  const Events events_;
  PathBar* path_ = nullptr;
  wxButton* tagFilter_ = nullptr;
  wxSearchCtrl* filter_ = nullptr;
  wxButton* order_ = nullptr;
  wxBitmapButton* direction_ = nullptr;
  bool descending_ = false;  // as the direction is drawn
  wxSlider* slider_ = nullptr;
};

}  // namespace fotomill::desktop
