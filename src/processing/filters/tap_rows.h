#pragma once

#include <cstdint>
#include <functional>
#include <vector>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/padded_rows.h"

namespace fotomill {

// What filters see that weigh the neighbors of a pixel one after the other: for a row of pixels,
// the row of their neighbors at a distance. Edges repeat. A neighbor counts by its alpha, and for
// what is missing the pixel counts itself, so that the hidden colors of transparent pixels do not
// come out. One object a band.
class TapRows {
 public:
  // Statuses as PaddedRows. The picture has 24 bits and stays as it is.
  Status Open(const PictureRecord& picture, int32_t reach);
  void MoveTo(int32_t y) { y_ = y; }
  // Blue, green, red of the neighbors (dx, dy) pixels to the right and below, at most `reach`. Good
  // until the next call.
  const uint8_t* At(int32_t dx, int32_t dy);
  // The row itself.
  const uint8_t* Own() { return colors_.Row(y_); }

 private:
  PaddedRows colors_, alpha_;
  std::vector<uint8_t> mixed_;
  int32_t y_ = 0, width_ = 0;
  bool hasAlpha_ = false;
};

// Replaces the pixels of a picture row by row: `row(taps, out)` writes blue, green, red of one row.
// Alpha stays. The picture is brought to 24 bits first. Statuses: EmptyImage,
// MemoryAllocationError, FunctionCancelled; the colors are unchanged then.
Status FilterRows(PictureRecord& picture, int32_t reach, const Work& work,
                  const std::function<void(TapRows& taps, uint8_t* out)>& row);

}  // namespace fotomill
