#pragma once

#include <wx/event.h>

#include <functional>
#include <string>
#include <unordered_set>
#include <vector>

#include "desktop/windows/browser/thumbnail_service.h"

namespace fotomill::desktop {

// Thumbnails of a progress box's files: those that the browser has loaded, and others, loaded apart
// when their rows are drawn.
class ProgressThumbnails : public wxEvtHandler {
 public:
  // With `makes`, missing thumbnails are made from the pictures; without it only those are loaded
  // that are stored or in the file. `came` is called when some have come.
  ProgressThumbnails(ThumbnailService& browser, bool makes, std::function<void()> came);

  // The thumbnail of a file, null if there is none yet.
  ThumbnailPointer Find(const std::string& path) const;
  // Wants that of a file that is in sight, in a square of `side` pixels of the screen.
  void Want(const std::string& path, int side);

 private:
  void Order();
  void FetchResults();

  ThumbnailService& browser_;
  const bool makes_;
  const std::function<void()> came_;
  ThumbnailCache cache_;
  int side_ = 0;
  std::vector<std::string> wanted_;          // since the last order
  std::unordered_set<std::string> settled_;  // whether there is one or not
  ThumbnailLoader loader_;                   // last, so that it ends first
};

}  // namespace fotomill::desktop
