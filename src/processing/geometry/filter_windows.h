#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "platform/memory.h"
#include "processing/geometry/resample_kernels.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// One axis of the source: `count` pixels, of which the range from `begin` of length `extent` is
// used, in pixels from the outer border of the first one. The first and last pixel may be partly
// outside that range.
struct SourceEdge {
  int32_t count;
  double begin, extent;
};

// The filter windows of all output pixels
// along one axis: source pixels and weights.
class FilterWindows {
 public:
  // Computes windows for `count` output pixels. `mostShift` limits the weights'
  // precision. MemoryAllocationError.
  Status Make(const SourceEdge& edge, int32_t count, ScaleFilter filter, int32_t mostShift);

  // In output order; valid until the next Make.
  std::span<const FilterWindow> Windows() { return windows_.Items<FilterWindow>(); }
  const FilterWindow& Window(int32_t i) { return Windows()[static_cast<size_t>(i)]; }
  int32_t Shift() const { return shift_; }        // the weights of a window add up to 2^shift
  int32_t MostTaps() const { return mostTaps_; }  // over all windows, including padding

 private:
  platform::MemoryBlock windows_, weights_;
  int32_t shift_ = 0, mostTaps_ = 0;
};

}  // namespace fotomill
