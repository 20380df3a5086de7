#pragma once

#include <wx/bmpbndl.h>
#include <wx/event.h>

#include <functional>
#include <string>
#include <unordered_map>
#include <vector>

#include "desktop/models/thumbnails/thumbnail_loader.h"

namespace fotomill::desktop {

// Thumbnails for the rows of the file history, loaded in the background; padded to squares of equal
// size, so that row heights do not change.
class HistoryThumbnails : public wxEvtHandler {
 public:
  // `came` is called with the paths of loaded thumbnails.
  explicit HistoryThumbnails(std::function<void(const std::vector<std::string>&)> came);

  // Requests thumbnails of files in squares of `side` screen pixels; 0: none.
  void Want(const std::vector<std::string>& paths, int side, double scale);
  // The thumbnail of a file, an empty square if not loaded yet.
  const wxBitmapBundle& Find(const std::string& path) const;

 private:
  void FetchResults();

  const std::function<void(const std::vector<std::string>&)> came_;
  std::unordered_map<std::string, wxBitmapBundle> bitmaps_;
  wxBitmapBundle empty_;
  int side_ = 0;
  double scale_ = 1;
  ThumbnailLoader loader_;  // must be last, so that it ends first
};

}  // namespace fotomill::desktop
