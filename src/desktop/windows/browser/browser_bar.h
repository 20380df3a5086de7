#pragma once

#include <wx/panel.h>

#include <cstdint>
#include <functional>
#include <string>

class wxButton;
class wxSearchCtrl;
class wxSlider;

namespace fotomill::desktop {

class BrowserModel;
class FolderTrail;
class PathBar;

// The bar above the files of a browser: its path, the filters by tags and by name, and the size of
// the thumbnails. Filters take effect in the model at once.
class BrowserBar : public wxPanel {
 public:
  // User actions.
  struct Events {
    std::function<void(int steps)> step;  // back or forward in the trail
    std::function<void()> up;
    std::function<void(const std::string& folder)> open;  // an existing folder
    std::function<void(int32_t side)> resize;             // edge of thumbnails
    std::function<void()> filtered;                       // the model has other lines
    std::function<void()> left;                           // the list gets the focus
  };
  // `model` and `trail` belong to the browser and must outlive the bar.
  BrowserBar(wxWindow* parent, BrowserModel& model, const FolderTrail& trail, Events events);

  // The browser's folder has changed: updates the path and empties the filter.
  void ShowFolder(const std::string& folder);
  // Updates the slider to the model's view.
  void ShowSide();
  void EditPath();    // focuses the path and selects its text
  void OfferTrail();  // shows a menu of visited folders
  void EditFilter();  // focuses the filter

 private:
  void BuildTagFilter();
  void BuildFilter();
  void BuildSlider();
  void ChooseTagFilter();
  void Leave();

  BrowserModel& model_;
  const Events events_;
  PathBar* path_ = nullptr;
  wxButton* tagFilter_ = nullptr;
  wxSearchCtrl* filter_ = nullptr;
  wxSlider* slider_ = nullptr;
};

}  // namespace fotomill::desktop
