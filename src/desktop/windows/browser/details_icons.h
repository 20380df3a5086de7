#pragma once

#include <wx/bmpbndl.h>
#include <wx/timer.h>

#include <functional>
#include <string>
#include <unordered_map>
#include <vector>

#include "desktop/models/browser/browser_model.h"
#include "desktop/windows/browser/thumbnail_service.h"

class wxWindow;

namespace fotomill::desktop {

// The small thumbnails in the rows of a Details view. Those of rows that are drawn are requested,
// a moment later all at once.
class DetailsIcons {
 public:
  // `changed` is called with a row whose icon is there now.
  DetailsIcons(const wxWindow& window, const BrowserModel& model, ThumbnailService& thumbnails,
               std::function<void(size_t line)> changed);

  // Edge of the icons in pixels; 0 if ShowDetailListThumbnails is off.
  int Side() const;
  // The icon of a row, which may still be empty.
  const wxBitmapBundle& IconOf(size_t line);
  // Call if the model has other lines.
  void Forget();
  void ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results);
  // Requests what is missing; call when the view becomes active.
  void WantThumbnails();

 private:
  wxBitmapBundle Drawn(const RgbImage& pixels) const;

  const wxWindow& window_;
  const BrowserModel& model_;
  ThumbnailService& thumbnails_;
  const std::function<void(size_t line)> changed_;
  std::unordered_map<std::string, size_t> missing_;  // paths with their rows
  struct Icon {
    ThumbnailPointer thumbnail;
    wxBitmapBundle bitmap;
  };
  std::unordered_map<std::string, Icon> icons_;  // by path
  wxBitmapBundle folder_, none_;
  wxTimer wait_;
};

}  // namespace fotomill::desktop
