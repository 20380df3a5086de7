#pragma once

#include <cstdint>

#include "core/status.h"
#include "platform/memory.h"
#include "processing/color/nearest_color.h"

namespace fotomill {

// Each function turns one row of pixels into one byte each: an index into the palette that `nearest` searches, or 1 for
// white and 0 for black of a row of brightnesses.

// Each pixel takes the color nearest to it.
void MapRow(const uint8_t* bgr, int32_t width, NearestColor& nearest, uint8_t* indices);
// `y` chooses the row of the threshold pattern; `spread` is the distance of two colors that it is to bridge.
void OrderRow(const uint8_t* bgr, int32_t width, int32_t y, int32_t spread, NearestColor& nearest, uint8_t* indices);
void OrderGrayRow(const uint8_t* gray, int32_t width, int32_t y, uint8_t* indices);
// White from `threshold` on.
void CutGrayRow(const uint8_t* gray, int32_t width, int32_t threshold, uint8_t* indices);

// Hands each pixel's error on to its neighbours, so it must see all rows from the top down.
class ErrorDiffuser {
 public:
  // For rows of `width` pixels; with `serpentine` every other one is taken from the right. A pixel hands on `handedOn`
  // sixteenths of its error. MemoryAllocationError.
  Status Open(int32_t width, bool serpentine, int32_t handedOn);
  void Row(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  void GrayRow(const uint8_t* gray, uint8_t* indices);

 private:
  template <int step>
  void DiffuseRow(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  template <int step>
  void DiffuseGrayRow(const uint8_t* gray, uint8_t* indices);

  platform::MemoryBlock errors_;
  int32_t* below_ = nullptr;  // 256ths of a level handed down to each pixel of the next row, a spare pixel on both sides
  int32_t width_ = 0, handedOn_ = 16;
  bool serpentine_ = false, backwards_ = false;
};

}  // namespace fotomill
