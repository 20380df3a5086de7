#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// A row of pixels under a vignette. Distances are squared and relative: 1 in the corners.
struct VignetteRow {
  const double* across;  // the part of each pixel's distance along the row
  double down;           // the part of all of them
  double size;           // distance up to which nothing changes, not squared; below 1 or nothing does
  double amount;         // share of the color in the corners
  uint8_t color[3];      // blue, green, red
};

// Blends a row of pixels with the color by their distance.
using ShadeRow = void (*)(const VignetteRow& row, uint8_t* bgr, size_t pixels);

// The function for this processor, and the one for every processor of the build. The results are
// identical.
ShadeRow ShadeRowHere();
ShadeRow BaselineShadeRow();

}  // namespace fotomill
