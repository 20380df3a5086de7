#pragma once

#include <cstdint>

#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// Facts about an output besides its record.
struct LeftOutFacts {
  bool metadataWanted = true;  // false: metadata was removed on request
  int32_t pages = 0;           // number of the source's pages without output
  bool frames = false;         // the pages are animation frames
  bool transparency = false;   // alpha was flattened
};

// Names what is missing in an output compared to its source, as a sentence; empty for nothing. The
// record says what reading and writing did not support.
RecordedText LeftOut(const PictureRecord& picture, const LeftOutFacts& facts);

}  // namespace fotomill
