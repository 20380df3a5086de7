#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "platform/memory.h"
#include "processing/color/nearest_color.h"
#include "processing/palette/dither.h"

namespace fotomill {

// A pixel that gets a share of another one's error: `ahead` pixels in the direction of travel,
// `down` rows below.
struct ErrorShare {
  int32_t ahead, down;
  int32_t weight;  // of the kernel's divisor
};
struct DiffusionKernel {
  std::span<const ErrorShare> shares;
  int32_t divisor;
};

// Whether a dither spreads errors as WideDiffuser does; Floyd-Steinberg has a faster class of its
// own.
constexpr bool IsWideDiffusion(Dither dither) {
  return dither >= Dither::Atkinson && dither <= Dither::Sierra;
}
// Its kernel. Sources: Atkinson's dither of the first Macintosh (it drops a quarter of the error);
// Stucki, "MECCA", IBM Research Report RZ1060 (1981); Burkes (1988); Sierra's filter of three rows
// (1989).
DiffusionKernel KernelOf(Dither dither);

// Diffuses errors up to two pixels and two rows far, so it must see all rows from the top down.
class WideDiffuser {
 public:
  // For rows of `width` pixels; with `serpentine` every other one is taken from the right. A pixel
  // hands on `handedOn` sixteenths of its error. MemoryAllocationError.
  Status Open(Dither dither, int32_t width, bool serpentine, int32_t handedOn);
  // As ErrorDiffuser: a row of pixels to indices, a row of brightnesses to 0 and 1.
  void Row(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices);
  void GrayRow(const uint8_t* gray, uint8_t* indices);  // one byte a pixel

 private:
  static constexpr int32_t kRows = 3, kReach = 2;  // of a kernel
  static constexpr int32_t kMostShares = 12;
  int32_t* RowOfErrors(int32_t down) { return errors_ + ((row_ + down) % kRows) * stride_; }
  void BeginRow();
  void EndRow();

  platform::MemoryBlock block_;
  // three rows in turn, 65536ths of a level, two spare pixels on both sides
  int32_t* errors_ = nullptr;
  std::ptrdiff_t stride_ = 0;  // numbers in a row of errors
  DiffusionKernel kernel_{};
  int32_t width_ = 0, handedOn_ = 16, row_ = 0;
  bool serpentine_ = false;
  // Of the row in work.
  int32_t step_ = 1;
  int32_t shares_ = 0;
  struct Share {
    int32_t* row;     // of errors, at pixel 0
    int32_t ahead;    // pixels, signed by the direction
    int32_t factor;   // of an error in levels, to 65536ths of a level
  } targets_[kMostShares] = {};
};

}  // namespace fotomill
