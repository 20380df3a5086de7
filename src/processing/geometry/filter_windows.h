#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "platform/memory.h"
#include "processing/geometry/resample_kernels.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// An edge of the source: it has `count` pixels, and reaches from `begin` over a length of `extent`,
// counted in pixels from the first one's outer border. The first and the last pixel may reach
// beyond it.
struct SourceEdge {
  int32_t count;
  double begin, extent;
};

// The windows of all output pixels along one edge: which source pixels each is made of, and their
// weights.
class FilterWindows {
 public:
  // Windows for `count` output pixels. `mostShift` bounds the weights' precision.
  // MemoryAllocationError.
  Status Make(const SourceEdge& edge, int32_t count, ScaleFilter filter, int32_t mostShift);

  // In the order of the output pixels; they hold until the next Make.
  std::span<const FilterWindow> Windows() { return windows_.Items<FilterWindow>(); }
  const FilterWindow& Window(int32_t i) { return Windows()[static_cast<size_t>(i)]; }
  int32_t Shift() const { return shift_; }        // the weights of a window add up to 2^shift
  int32_t MostTaps() const { return mostTaps_; }  // of any window, zeros behind the last included

 private:
  platform::MemoryBlock windows_, weights_;
  int32_t shift_ = 0, mostTaps_ = 0;
};

}  // namespace fotomill
