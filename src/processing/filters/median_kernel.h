#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Sixteen counts. A histogram of 256 levels
// has 16 groups of 16 levels.
inline constexpr size_t kCountsInGroup = 16;

// The column histograms below a row of windows, for one channel:
// for each column, the sample count of each group of levels, and
// for each group, the count of each of its levels. Not owned.
struct ColumnCounts {
  const uint16_t* groups = nullptr;  // column j is at groups + j * stride
  // column j and group g are at levels + g * groupStride + j * stride
  const uint16_t* levels = nullptr;
  size_t stride = 0, groupStride = 0;
};

// Medians of `count` windows, each `window` columns wide (odd, at most 255) and equally high; the
// first one starts at column 0. Median x goes to out[x * step].
using MedianRow = void (*)(const ColumnCounts& columns, int32_t window, int32_t count, uint8_t* out,
                           size_t step);

// For this processor, and portable. The results are identical.
MedianRow MedianRowHere();
MedianRow BaselineMedianRow();  // runs on every processor

}  // namespace fotomill
