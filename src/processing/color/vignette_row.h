#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// A row of pixels to be vignetted. Distances are squared and relative: 1 in the corners.
struct VignetteRow {
  const double* across;  // horizontal part of each pixel's distance
  double down;           // vertical part, the same for all
  double size;           // unaffected radius, not squared; 1 or more: no effect
  double amount;         // opacity of the color in the corners
  uint8_t color[3];      // blue, green, red
};

// Blends a row of pixels with the color according to their distance.
using ShadeRow = void (*)(const VignetteRow& row, uint8_t* bgr, size_t pixels);

// The function for this processor, and the one for every processor of the build. The results are
// identical.
ShadeRow ShadeRowHere();
ShadeRow BaselineShadeRow();

}  // namespace fotomill
