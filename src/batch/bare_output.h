#pragma once

#include <cstdint>
#include <vector>

#include "core/status.h"
#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// An output that is its source without metadata, with the compressed pixels copied.
struct BareOutput {
  std::vector<uint8_t> file;  // empty: the picture must be encoded
  RecordedText note = {};     // the reason for that, if it needs explaining
  bool asSource = false;      // encode with the quality of the source
};

// Makes the file for an unmodified picture read from
// `picture.fileName`, if the format supports it. `upright`: turn
// the picture by EXIF orientation, but only if that is lossless.
BareOutput MakeBareOutput(const PictureRecord& picture, bool upright);

}  // namespace fotomill
