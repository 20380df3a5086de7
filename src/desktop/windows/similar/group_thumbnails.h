#pragma once

#include <wx/bitmap.h>

#include <functional>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "desktop/models/similar/similar_run.h"
#include "desktop/models/thumbnails/thumbnail_loader.h"
#include "desktop/windows/widgets/window_calls.h"

namespace fotomill::desktop {

// Thumbnails of pictures in groups, loaded in the background.
class GroupThumbnails {
 public:
  // `came` is called on the window's thread when some are loaded.
  explicit GroupThumbnails(std::function<void()> came);
  ~GroupThumbnails();
  GroupThumbnails(const GroupThumbnails&) = delete;
  GroupThumbnails& operator=(const GroupThumbnails&) = delete;

  // Requests thumbnails in squares of `side` screen pixels, most urgent first; earlier requests are
  // replaced.
  void Want(const std::vector<SimilarPicture>& pictures, int side, double scale);
  // Null while it is loaded; not ok if the picture cannot be read.
  const wxBitmap* Find(const SimilarPicture& picture, int side, double scale);

 private:
  void FetchResults();

  const std::function<void()> came_;
  ThumbnailCache cache_;
  std::unordered_map<ThumbnailPointer, wxBitmap> bitmaps_;  // of the thumbnails drawn lately
  const WindowCalls calls_;                                 // of the loader
  std::unique_ptr<ThumbnailLoader> loader_;
};

}  // namespace fotomill::desktop
