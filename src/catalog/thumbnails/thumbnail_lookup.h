#pragma once

#include <cstdint>
#include <string>

#include "catalog/thumbnails/thumbnail_drawing.h"
#include "core/choice_lists.h"

namespace fotomill {

class ListedThumbnails;
class ThumbnailStore;

// The picture whose thumbnail is wanted.
struct ThumbnailQuery {
  std::string path;
  int64_t modified = 0;  // seconds since 1970 UTC; with a size of 0 as well, not known
  uint64_t size = 0;     // bytes
  bool large = false;    // for a large view
};

// Where a browser's thumbnails may come from.
struct ThumbnailSources {
  choice::ThumbnailMode mode = choice::kDiskBased;
  bool systemCache = true;  // the browser lets large records come from the system
  ListedThumbnails* listed = nullptr;   // of the virtual mode, or none
  ThumbnailStore* databases = nullptr;  // of the two database modes, or none
  ThumbnailOptions options = {};
};

// The database of a picture's browser in the two database modes; empty in the others, and where
// there is no data folder.
std::string DatabaseForMode(choice::ThumbnailMode mode, const std::string& picturePath);

// Fills a record with the thumbnail of a picture as the mode says: thumbnail file, list, database
// or, for a large view in the disk-based mode, the system's cache. Large records come from that
// cache only. Whatever is older than the picture, or was made of other contents, is passed over.
// False if there is no thumbnail.
bool LookUpThumbnail(const ThumbnailQuery& picture, const ThumbnailSources& sources,
                     AnyThumbnailRecord& record);

}  // namespace fotomill
