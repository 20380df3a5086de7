#pragma once

#include <wx/bmpbndl.h>
#include <wx/event.h>

#include <functional>
#include <string>
#include <unordered_map>
#include <vector>

#include "desktop/models/thumbnails/thumbnail_loader.h"

namespace fotomill::desktop {

// Thumbnails of the file history's rows, made apart; each on a square of one size, so that rows
// keep their height.
class HistoryThumbnails : public wxEvtHandler {
 public:
  // `came` is called with the paths whose thumbnails are there now.
  explicit HistoryThumbnails(std::function<void(const std::vector<std::string>&)> came);

  // Thumbnails of these files in squares of `side` pixels of the screen; 0 for none.
  void Want(const std::vector<std::string>& paths, int side, double scale);
  // The thumbnail of a file, an empty square until it is there.
  const wxBitmapBundle& Find(const std::string& path) const;

 private:
  void FetchResults();

  const std::function<void(const std::vector<std::string>&)> came_;
  std::unordered_map<std::string, wxBitmapBundle> bitmaps_;
  wxBitmapBundle empty_;
  int side_ = 0;
  double scale_ = 1;
  ThumbnailLoader loader_;  // last, so that it ends first
};

}  // namespace fotomill::desktop
