#pragma once

#include <cstdint>
#include <functional>
#include <vector>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/padded_rows.h"

namespace fotomill {

// The input of filters that add up weighted neighbors one at a time: for a
// row of pixels, the row of their neighbors at an offset. Edges are
// repeated. Neighbors are blended by their alpha with the pixel itself, so
// that the colors of transparent pixels do not bleed. One object per band.
class TapRows {
 public:
  // Statuses as PaddedRows. The picture must have 24 bits and is not changed.
  Status Open(const PictureRecord& picture, int32_t reach);
  void MoveTo(int32_t y) { y_ = y; }
  // Blue, green, red of the neighbors at offset (dx, dy), at most `reach`. Valid until
  // the next call.
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
// Alpha is unchanged. The picture is converted to 24 bits first. Statuses: EmptyImage,
// MemoryAllocationError, FunctionCancelled; the colors are unchanged then.
Status FilterRows(PictureRecord& picture, int32_t reach, const Work& work,
                  const std::function<void(TapRows& taps, uint8_t* out)>& row);

}  // namespace fotomill
