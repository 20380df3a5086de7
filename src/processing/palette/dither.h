#pragma once

#include <cstdint>

#include "core/status.h"
#include "platform/memory.h"

namespace fotomill {

class NearestColor;

// Dithering algorithms. The first three are the values of the keys FXColorDither (4 and 8 bits) and
// FXMonoDither (1 bit).
enum class Dither : int32_t {
  None = 0,            // each pixel takes the nearest color, or is compared with the threshold
  Ordered = 1,         // an 8 x 8 threshold matrix (Bayer 1973)
  FloydSteinberg = 2,  // error diffusion (Floyd and Steinberg 1976)
  Ordered4 = 3,        // 4 x 4 and 2 x 2 matrices
  Ordered2 = 4,
  Atkinson = 5,        // error diffusion, see diffusion.h
  Stucki = 6,
  Burkes = 7,
  Sierra = 8,
};
// The matrix size of an ordered dither, 0 for others.
constexpr int32_t PatternSize(Dither dither) {
  return dither == Dither::Ordered    ? 8
         : dither == Dither::Ordered4 ? 4
         : dither == Dither::Ordered2 ? 2
                                      : 0;
}

// Each function converts a row of pixels to one byte each: an index into the palette of `nearest`,
// or for a row of gray levels 1 for white and 0 for black.

// Maps each pixel to the nearest color.
void MapRow(const uint8_t* bgr, int32_t width, NearestColor& nearest, uint8_t* indices);
// Ordered dither. `y` selects the row of the threshold matrix of `size` x `size`; `spread` is the
// color distance to be bridged.
void OrderRow(const uint8_t* bgr, int32_t width, int32_t y, int32_t size, int32_t spread,
              NearestColor& nearest, uint8_t* indices);
// Ordered dither to black and white.
void OrderGrayRow(const uint8_t* gray, int32_t width, int32_t y, int32_t size, uint8_t* indices);
// White at `threshold` and above.
void CutGrayRow(const uint8_t* gray, int32_t width, int32_t threshold, uint8_t* indices);

// Floyd-Steinberg error diffusion, so rows must be passed from the top down.
class ErrorDiffuser {
 public:
  // For rows of `width` pixels; with `serpentine` every other row is scanned from the right.
  // `handedOn` is the share of the error to diffuse, in sixteenths. MemoryAllocationError.
  Status Open(int32_t width, bool serpentine, int32_t handedOn);
  // The next row, `width` pixels.
  void Row(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  void GrayRow(const uint8_t* gray, uint8_t* indices);  // one byte per pixel

 private:
  template <int step>
  void DiffuseRow(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  template <int step>
  void DiffuseGrayRow(const uint8_t* gray, uint8_t* indices);

  platform::MemoryBlock errors_;
  // errors diffused to the next row, in 1/256 of a level, with one padding pixel on both sides
  int32_t* below_ = nullptr;
  int32_t width_ = 0, handedOn_ = 16;
  bool serpentine_ = false, backwards_ = false;
};

}  // namespace fotomill
