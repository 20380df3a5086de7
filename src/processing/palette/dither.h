#pragma once

#include <cstdint>

#include "core/status.h"
#include "platform/memory.h"

namespace fotomill {

class NearestColor;

// How the colors that a palette lacks are imitated. The first three are the values of the keys
// FXColorDither (4 and 8 bits) and FXMonoDither (1 bit).
enum class Dither : int32_t {
  None = 0,            // each pixel takes the nearest color, or is cut at the threshold
  Ordered = 1,         // a fixed pattern of 8 x 8 thresholds (Bayer 1973)
  FloydSteinberg = 2,  // each pixel's error goes to its neighbors (Floyd and Steinberg 1976)
  Ordered4 = 3,        // patterns of 4 x 4 and 2 x 2
  Ordered2 = 4,
  Atkinson = 5,        // error diffusion as diffusion.h says
  Stucki = 6,
  Burkes = 7,
  Sierra = 8,
};
// The edge of the pattern of an ordered dither, 0 for others.
constexpr int32_t PatternSize(Dither dither) {
  return dither == Dither::Ordered    ? 8
         : dither == Dither::Ordered4 ? 4
         : dither == Dither::Ordered2 ? 2
                                      : 0;
}

// Each function turns one row of pixels into one byte each: an index into the palette that
// `nearest` searches, or 1 for white and 0 for black of a row of brightnesses.

// Each pixel takes the color nearest to it.
void MapRow(const uint8_t* bgr, int32_t width, NearestColor& nearest, uint8_t* indices);
// An ordered dither. `y` chooses the row of the threshold pattern of `size` x `size`; `spread` is
// the distance of two colors that it is to bridge.
void OrderRow(const uint8_t* bgr, int32_t width, int32_t y, int32_t size, int32_t spread,
              NearestColor& nearest, uint8_t* indices);
// The same between black and white.
void OrderGrayRow(const uint8_t* gray, int32_t width, int32_t y, int32_t size, uint8_t* indices);
// White from `threshold` on.
void CutGrayRow(const uint8_t* gray, int32_t width, int32_t threshold, uint8_t* indices);

// Hands each pixel's error on to its neighbours, so it must see all rows from the top down.
class ErrorDiffuser {
 public:
  // For rows of `width` pixels; with `serpentine` every other one is taken from the right. A pixel
  // hands on `handedOn` sixteenths of its error. MemoryAllocationError.
  Status Open(int32_t width, bool serpentine, int32_t handedOn);
  // The next row, `width` pixels.
  void Row(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  void GrayRow(const uint8_t* gray, uint8_t* indices);  // one byte a pixel

 private:
  template <int step>
  void DiffuseRow(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  template <int step>
  void DiffuseGrayRow(const uint8_t* gray, uint8_t* indices);

  platform::MemoryBlock errors_;
  // 256ths of a level handed down to each pixel of the next row, a spare pixel on both sides
  int32_t* below_ = nullptr;
  int32_t width_ = 0, handedOn_ = 16;
  bool serpentine_ = false, backwards_ = false;
};

}  // namespace fotomill
