#pragma once

#include <wx/event.h>

#include <functional>
#include <string>
#include <unordered_set>
#include <vector>

#include "desktop/models/thumbnails/thumbnail_loader.h"

namespace fotomill::desktop {

class ThumbnailService;

// Thumbnails for a progress box: those loaded by the browser, and others loaded in the background
// when their rows are drawn.
class ProgressThumbnails : public wxEvtHandler {
 public:
  // With `makes`, creates missing thumbnails from the pictures; otherwise only loads stored or
  // embedded ones. `came` is called when thumbnails have been loaded.
  ProgressThumbnails(ThumbnailService& browser, bool makes, std::function<void()> came);

  // The thumbnail of a file; null if not loaded yet.
  ThumbnailPointer Find(const std::string& path) const;
  // Requests the thumbnail of a visible file, in a square of `side` screen pixels.
  void Want(const std::string& path, int side);

 private:
  void Order();
  void FetchResults();

  ThumbnailService& browser_;
  const bool makes_;
  const std::function<void()> came_;
  ThumbnailCache cache_;
  int side_ = 0;
  std::vector<std::string> wanted_;          // since the last Order
  std::unordered_set<std::string> settled_;  // loaded or found missing
  ThumbnailLoader loader_;                   // must be last, so that it ends first
};

}  // namespace fotomill::desktop
