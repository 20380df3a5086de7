#pragma once

#include <wx/scrolwin.h>

#include <functional>
#include <set>
#include <string>
#include <vector>

#include "desktop/windows/history/history_thumbnails.h"

namespace fotomill::desktop {

// A row of thumbnails to choose one of several pictures, with mouse or arrow keys.
class PictureStrip : public wxScrolledCanvas {
 public:
  // `chosen` is called with the place of another picture.
  PictureStrip(wxWindow* parent, const std::vector<std::string>& files,
               std::function<void(size_t place)> chosen);

  void Choose(size_t place);  // also calls `chosen`
  // Marks a picture as done; marks are drawn as a check.
  void Mark(size_t place, bool done);

 private:
  void OnPaint(wxPaintEvent&);
  void OnMouse(wxMouseEvent& event);
  void OnKey(wxKeyEvent& event);
  int CellWidth() const { return FromDIP(76); }
  void WantVisible();
  void ScrollTo(size_t place);

  const std::vector<std::string> files_;
  const std::function<void(size_t place)> chosen_;
  size_t place_ = 0;
  std::set<size_t> marks_;
  HistoryThumbnails thumbnails_;
};

}  // namespace fotomill::desktop
