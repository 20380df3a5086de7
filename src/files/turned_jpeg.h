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

// Options for turning a picture.
struct JpegTurnRequest {
  Orientation turn = Orientation::Upright;  // as displayed
  // the picture is displayed by EXIF orientation; false: as stored
  bool seenByExif = true;
  bool trim = false;                        // crop edges that cannot be turned losslessly
  StopToken stop = {};                      // cancels with FunctionCancelled (4)
  // for the embedded thumbnail, if it cannot be turned losslessly
  EncodeOptions encode = {};
};

// How a JPEG file was turned.
enum class JpegTurnMethod {
  Pixels,   // turned losslessly; orientation is now 1
  Trimmed,  // as Pixels, but with an edge cropped
  Tag,      // only the EXIF and XMP orientation was changed
  Nothing,  // already in this orientation
};
// The result of turning a JPEG file.
struct JpegTurnResult {
  JpegTurnMethod method = JpegTurnMethod::Nothing;
  RecordedText obstacle;  // why the pixels were not turned, a sentence
};

// Losslessly turns a JPEG picture. If the pixels cannot be turned, the
// orientation is set instead. EXIF, XMP, all other segments and data after
// the picture are kept; sizes and thumbnail in EXIF are turned with the
// pixels. `made` is empty for Nothing. Statuses of reading; UnsuitableImage
// (13), with the obstacle, if neither pixels nor orientation can be changed.
Status MakeTurnedJpeg(std::span<const uint8_t> file, const JpegTurnRequest& request,
                      std::vector<uint8_t>& made, JpegTurnResult& result);

}  // namespace fotomill
