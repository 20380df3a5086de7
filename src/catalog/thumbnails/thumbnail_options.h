#pragma once

#include <cstdint>

#include "core/choice_lists.h"
#include "picture/palette.h"
#include "picture/read_request.h"
#include "processing/faces/face_options.h"

namespace fotomill {

// How thumbnails are created, stored and shown.
struct ThumbnailOptions {
  bool quick = false;       // use the quick scaler
  Color matte = 0xCCCCCC;   // around pictures and behind transparency
  bool hidden = true;       // hide thumbnail files and databases
  bool fromFiles = true;    // use thumbnail files in the database and virtual modes as well
  bool fromSystem = true;   // use the system's thumbnails for large ones
  bool keep = true;         // store thumbnails made for a browser in its database
  bool fastZoom = false;    // enlarge small records by repeating pixels
  int32_t zoomFilter = choice::kBicubic;  // else this choice::ResampleFilter
  bool onFaces = false;        // crop stored ones to the largest face
  bool onFacesUnkept = false;  // also crop those made for a browser and not stored
  bool onAllFaces = false;     // crop to all faces instead of the largest
  FaceOptions faces = {};
  ReadOptions read = {};                  // for decoding the pictures

  bool operator==(const ThumbnailOptions&) const = default;
};

}  // namespace fotomill
