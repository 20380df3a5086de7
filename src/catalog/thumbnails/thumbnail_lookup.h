#pragma once

#include <functional>
#include <string>
#include <string_view>

#include "catalog/thumbnails/thumbnail_drawing.h"
#include "core/choice_lists.h"

namespace fotomill {

class ThumbnailDatabase;

// Where a browser's thumbnails may come from.
struct ThumbnailSources {
  choice::ThumbnailMode mode = choice::kDiskBased;
  bool systemCache = true;  // the browser lets large records come from the system
  // Virtual mode: the record that the browser's list holds for a file name; null when it has none.
  std::function<const ThumbnailRecord*(std::string_view name)> listed;
  // of the two database modes, open; null when it could not be opened
  ThumbnailDatabase* database = nullptr;
  ThumbnailOptions options = {};
};

// Fills a record with the thumbnail of a picture as the mode says: thumbnail file, list, database
// or, for a large view in the disk-based mode, the system's cache. Large records come from that
// cache only. False if there is no thumbnail.
bool LookUpThumbnail(const std::string& picturePath, bool large, const ThumbnailSources& sources,
                     AnyThumbnailRecord& record);

}  // namespace fotomill
