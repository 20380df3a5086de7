#pragma once

#include <cstdint>
#include <string>

#include "catalog/thumbnails/thumbnail_drawing.h"
#include "core/choice_lists.h"

namespace fotomill {

class ListedThumbnails;
class ThumbnailStore;

// The picture whose thumbnail to find.
struct ThumbnailQuery {
  std::string path;
  int64_t modified = 0;  // seconds since 1970 UTC; unknown if `size` is 0 as well
  uint64_t size = 0;     // bytes
  bool large = false;    // for a large view
};

// Where to look for a browser's thumbnails.
struct ThumbnailSources {
  choice::ThumbnailMode mode = choice::kDiskBased;
  bool systemCache = true;  // large records may come from the system's cache
  ListedThumbnails* listed = nullptr;   // for the virtual mode; may be null
  ThumbnailStore* databases = nullptr;  // for the two database modes; may be null
  ThumbnailOptions options = {};
};

// The database for a picture in the two database modes; empty in other modes, or without a data
// folder.
std::string DatabaseForMode(choice::ThumbnailMode mode, const std::string& picturePath);

// Finds the thumbnail of a picture according to the mode: in the thumbnail file, list, database or,
// for a large view in the disk-based mode, the system's cache. Large records only come from that
// cache. Thumbnails older than the picture, or of other contents, are ignored. False if there is
// none.
bool LookUpThumbnail(const ThumbnailQuery& picture, const ThumbnailSources& sources,
                     AnyThumbnailRecord& record);

}  // namespace fotomill
