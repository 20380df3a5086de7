#pragma once

#include <cstdint>
#include <vector>

#include "core/status.h"
#include "processing/color/color_histogram.h"
#include "processing/color/nearest_color.h"

namespace fotomill {

// Finds at most `colors` (1 to 256) colors that stand for the bins with the least squared error:
// groups are cut in two across their longest axis, the worst group first (Orchard and Bouman 1991),
// then all are moved to the middle of the bins nearest to them, over and over (Lloyd 1982).
// MemoryAllocationError.
Status FitPalette(const std::vector<ColorBin>& bins, int32_t colors, ColorPoints& points);

// Sums of the pixels that took each color.
class ColorMeans {
 public:
  // Takes in one row: pixels of three bytes, and the index of the color that each took.
  void AddRow(const uint8_t* bgr, const uint8_t* indices, int32_t width);
  // Moves each color to the mean of its pixels; one that no pixel took stays.
  void Move(ColorPoints& points) const;

 private:
  struct Sum {
    uint64_t channel[3], count;
  };
  Sum sums_[256] = {};
};

}  // namespace fotomill
