#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "processing/geometry/orient.h"
#include "texts/texts.h"

namespace fotomill {

// A JPEG picture turned without loss: its coefficients at other places, nothing decoded.
struct TurnedJpeg {
  // a JPEG file without application segments and comments; empty when there is an obstacle
  std::vector<uint8_t> file;
  int32_t width = 0, height = 0;  // of the turned picture
  bool trimmed = false;           // edges were cut off
  size_t end = 0;                 // where the picture ends in the old file; other bytes may follow
  // why it cannot be turned losslessly, as a sentence; the picture itself is sound
  RecordedText obstacle;
};

// Turns the picture of a JPEG file. Edges move only in whole blocks (8 pixels, 16 where colors are
// stored at half the size): where a side that changes its end has a rest, that is an obstacle; with
// `trim` up to 15 rows or columns of pixels are cut off instead. Progressive pictures stay so. The
// statuses are those of reading; FileReadError (3) for files cut short, FunctionCancelled (4) when
// `stop` was asked meanwhile.
Status TurnJpeg(std::span<const uint8_t> file, Orientation orientation, bool trim,
                const StopToken& stop, TurnedJpeg& turned);

}  // namespace fotomill
