#pragma once

#include <array>
#include <cstdint>

#include "desktop/models/drawing/list_palette.h"
#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// How many pixels have each level, from 0 to 255.
using Levels = std::array<uint32_t, 256>;

// The levels of a picture by channel.
struct Histogram {
  Levels red{}, green{}, blue{};

  bool operator==(const Histogram&) const = default;
};

// Counts the levels of a 24-bit image; of large ones, those of about a million pixels in a regular
// grid.
Histogram HistogramOf(const PackedImage& image);

// Draws the three channels over each other, dark levels on the left; where channels overlap, their
// colors mix. Heights are relative to the most frequent level, not counting pure black and white,
// which would flatten pictures with borders. Empty for a size below 1.
RgbImage HistogramPixels(const Histogram& histogram, int32_t width, int32_t height,
                         Shade background);

}  // namespace fotomill::desktop
