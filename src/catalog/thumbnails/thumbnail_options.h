#pragma once

#include <cstdint>

#include "core/choice_lists.h"
#include "picture/palette.h"
#include "picture/read_request.h"
#include "processing/faces/face_options.h"

namespace fotomill {

// How thumbnails are made, kept and shown.
struct ThumbnailOptions {
  bool quick = false;       // records are scaled by the quick scaler
  Color matte = 0xCCCCCC;   // around pictures and behind their alpha
  bool hidden = true;       // thumbnail files and databases are hidden
  bool fromFiles = true;    // thumbnail files serve in the database and virtual modes as well
  bool fromSystem = true;   // large ones may come from the system's own thumbnails
  bool keep = true;         // what was made for a browser goes into its database
  bool fastZoom = false;    // small records are enlarged by spreading their pixels
  int32_t zoomFilter = choice::kBicubic;  // else by this choice::ResampleFilter
  bool onFaces = false;        // stored ones show the largest face
  bool onFacesUnkept = false;  // so do those that are made for a browser and not stored
  bool onAllFaces = false;     // all faces instead of the largest
  FaceOptions faces = {};
  ReadOptions read = {};                  // how the pictures are decoded

  bool operator==(const ThumbnailOptions&) const = default;
};

}  // namespace fotomill
