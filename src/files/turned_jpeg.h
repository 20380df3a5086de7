#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/encode_options.h"
#include "processing/geometry/orient.h"
#include "texts/texts.h"

namespace fotomill {

// How to turn the picture.
struct JpegTurnRequest {
  Orientation turn = Orientation::Upright;  // of the picture as it is seen
  // it is seen as its EXIF orientation says; otherwise as its pixels are stored
  bool seenByExif = true;
  bool trim = false;                        // cut off edges that cannot be turned without loss
  StopToken stop = {};                      // ends the work with FunctionCancelled (4)
  // of the thumbnail inside, where that cannot be turned without loss
  EncodeOptions encode = {};
};

// How a JPEG file was turned.
enum class JpegTurnMethod {
  Pixels,   // turned without loss; the orientation became 1
  Trimmed,  // the same, but for an edge that was cut off
  Tag,      // the orientation of EXIF and XMP alone; everything else is as it was
  Nothing,  // the file says already what it should
};
// What came of turning a JPEG file.
struct JpegTurnResult {
  JpegTurnMethod method = JpegTurnMethod::Nothing;
  RecordedText obstacle;  // why the pixels were not turned, as a sentence
};

// Makes the file of a turned JPEG picture; no pixel gets another value. Where the pixels cannot be
// turned, the orientation is set instead, so that nothing is lost. EXIF, XMP and all other segments
// stay, as do bytes behind the picture; sizes and thumbnail in the EXIF block are turned with the
// pixels. `made` is empty for Nothing. Statuses: those of reading; UnsuitableImage (13) where
// neither pixels nor orientation can be changed, with the obstacle.
Status MakeTurnedJpeg(std::span<const uint8_t> file, const JpegTurnRequest& request,
                      std::vector<uint8_t>& made, JpegTurnResult& result);

}  // namespace fotomill
