#pragma once

#include <cstdint>
#include <vector>

#include "core/status.h"
#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// An output that is its source without metadata: the compressed pixels are copied.
struct BareOutput {
  std::vector<uint8_t> file;  // empty: the picture has to be encoded
  RecordedText note = {};     // why it has to be, if that is a surprise
  bool asSource = false;      // and then with the quality of its source
};

// Makes the file for a picture that was read from `picture.fileName` and not changed since, if the
// format can. `upright`: the picture is to be turned by its EXIF orientation, which happens without
// loss or not here.
BareOutput MakeBareOutput(const PictureRecord& picture, bool upright);

}  // namespace fotomill
