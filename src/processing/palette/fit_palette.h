#pragma once

#include <cstdint>
#include <vector>

#include "core/status.h"
#include "processing/color/color_histogram.h"
#include "processing/color/nearest_color.h"

namespace fotomill {

// Finds at most `colors` (1 to 256) colors that approximate the bins with the least squared
// error: groups are split across their principal axis, the worst group first (Orchard and
// Bouman 1991), then all colors are repeatedly moved to the means of the bins nearest to them
// (Lloyd 1982). MemoryAllocationError.
Status FitPalette(const std::vector<ColorBin>& bins, int32_t colors, ColorPoints& points);

// Mean color of the pixels mapped to each palette color.
class ColorMeans {
 public:
  // Adds a row: pixels of three bytes, and the palette index of each.
  void AddRow(const uint8_t* bgr, const uint8_t* indices, int32_t width);
  // Moves each color to the mean of its pixels; unused ones are unchanged.
  void Move(ColorPoints& points) const;

 private:
  struct Sum {
    uint64_t channel[3], count;
  };
  Sum sums_[256] = {};
};

}  // namespace fotomill
