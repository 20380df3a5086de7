#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Sixteen counts. A histogram of 256 levels is sixteen groups of levels, and sixteen levels in each
// group.
inline constexpr size_t kCountsInGroup = 16;

// The histograms of the columns that a row of windows covers, for one channel: for each column, how
// many of its samples are in each group of levels, and for each group, how many have each of its
// levels. Not owned.
struct ColumnCounts {
  const uint16_t* groups = nullptr;  // of column j from groups + j * stride on
  // of column j and group g from levels + g * groupStride + j * stride on
  const uint16_t* levels = nullptr;
  size_t stride = 0, groupStride = 0;
};

// Medians of `count` windows, `window` columns each (odd, at most 255), as many rows high; the
// first one begins at column 0. Median x goes to out[x * step].
using MedianRow = void (*)(const ColumnCounts& columns, int32_t window, int32_t count, uint8_t* out,
                           size_t step);

// For this processor, and for any. Both give the same.
MedianRow MedianRowHere();
MedianRow BaselineMedianRow();  // the one that every processor can run

}  // namespace fotomill
