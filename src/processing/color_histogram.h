#pragma once

#include <cstdint>
#include <vector>

#include "core/status.h"
#include "platform/memory.h"

namespace fotomill {

// A group of similar colours: their mean and how many pixels have one of them.
struct ColorBin {
  float channel[3];  // blue, green, red, 0 to 255
  float weight;      // pixels
};

// Gathers the colours of a picture into 32 x 32 x 32 cells.
class ColorHistogram {
 public:
  Status Open();  // MemoryAllocationError
  void AddRow(const uint8_t* bgr, int32_t width);
  // The cells that hold pixels.
  std::vector<ColorBin> Bins();

 private:
  struct Cell {
    uint32_t low[3];  // sums of the bits below the cell's own: a packed image has too few pixels to overflow them
    uint32_t count;
  };

  platform::MemoryBlock cells_;
};

}  // namespace fotomill
