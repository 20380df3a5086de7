#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "platform/memory.h"
#include "processing/color/nearest_color.h"
#include "processing/palette/dither.h"

namespace fotomill {

// A pixel that receives a share of another one's error: `ahead` pixels in scan direction, `down`
// rows below.
struct ErrorShare {
  int32_t ahead, down;
  int32_t weight;  // in units of 1 / divisor of the kernel
};
struct DiffusionKernel {
  std::span<const ErrorShare> shares;
  int32_t divisor;
};

// Whether a dither is handled by WideDiffuser;
// Floyd-Steinberg has a faster class.
constexpr bool IsWideDiffusion(Dither dither) {
  return dither >= Dither::Atkinson && dither <= Dither::Sierra;
}
// Kernel of such a dither. Sources: Atkinson's dither of the first Macintosh (it drops a quarter of
// the error); Stucki, "MECCA", IBM Research Report RZ1060 (1981); Burkes (1988); Sierra's filter of
// three rows (1989).
DiffusionKernel KernelOf(Dither dither);

// Diffuses errors up to two pixels and two rows away, so rows must be passed from the top down.
class WideDiffuser {
 public:
  // For rows of `width` pixels; with `serpentine` every other row is scanned from the right.
  // `handedOn` is the share of the error to diffuse, in sixteenths. MemoryAllocationError.
  Status Open(Dither dither, int32_t width, bool serpentine, int32_t handedOn);
  // As ErrorDiffuser: a row of pixels to palette indices, a row of gray levels to 0 and 1.
  void Row(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  void GrayRow(const uint8_t* gray, uint8_t* indices);  // one byte per pixel

 private:
  static constexpr int32_t kRows = 3, kReach = 2;  // kernel size
  static constexpr int32_t kMostShares = 12;
  int32_t* RowOfErrors(int32_t down) { return errors_ + ((row_ + down) % kRows) * stride_; }
  void BeginRow();
  void EndRow();

  platform::MemoryBlock block_;
  // ring of three rows, in 1/65536 of a level, with two padding pixels on both sides
  int32_t* errors_ = nullptr;
  std::ptrdiff_t stride_ = 0;  // elements per row of errors
  DiffusionKernel kernel_{};
  int32_t width_ = 0, handedOn_ = 16, row_ = 0;
  bool serpentine_ = false;
  // Of the current row.
  int32_t step_ = 1;
  int32_t shares_ = 0;
  struct Share {
    int32_t* row;     // errors, at pixel 0
    int32_t ahead;    // pixels, signed by scan direction
    int32_t factor;   // from an error in levels to 65536ths of a level
  } targets_[kMostShares] = {};
};

}  // namespace fotomill
