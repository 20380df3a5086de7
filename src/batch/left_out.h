#pragma once

#include <cstdint>

#include "picture/picture_record.h"
#include "texts/texts.h"

namespace fotomill {

// What is known about an output beside its record.
struct LeftOutFacts {
  bool metadataWanted = true;  // what the user had removed is not left out
  int32_t pages = 0;           // of the source that no output of it has
  bool frames = false;         // these are frames of an animation
  bool transparency = false;   // alpha was flattened
};

// Names what of the source is not in its written output, as a sentence; empty for nothing. The
// record says what reading and writing could not take.
RecordedText LeftOut(const PictureRecord& picture, const LeftOutFacts& facts);

}  // namespace fotomill
