#pragma once

#include <cstdint>
#include <vector>

#include "core/status.h"
#include "platform/memory.h"

namespace fotomill {

// A group of similar colors: their mean and their pixel count.
struct ColorBin {
  float channel[3];  // blue, green, red, 0 to 255
  float weight;      // pixels
};

// A color histogram with 64 x 64 x 64 cells.
class ColorCells {
 public:
  Status Open();  // MemoryAllocationError
  void AddRow(const uint8_t* bgr, int32_t width);  // pixels of three bytes
  // The non-empty cells.
  std::vector<ColorBin> Bins();

 private:
  struct Cell {
    // sums of the bits below the cell's; a packed image has too few pixels to overflow them
    uint32_t low[3];
    uint32_t count;
  };

  platform::MemoryBlock cells_;
};

// An exact color histogram for pictures of at most
// kMostColors colors; further colors are ignored.
class ColorCounts {
 public:
  static constexpr uint32_t kMostColors = 65536;

  Status Open();  // MemoryAllocationError
  void AddRow(const uint8_t* bgr, int32_t width);  // `width` pixels
  std::vector<ColorBin> Bins();  // the colors found

 private:
  struct Slot {
    uint32_t color, count;  // 0x00RRGGBB; a count of 0 means a free slot
  };

  platform::MemoryBlock slots_;
  uint32_t colors_ = 0;
};

}  // namespace fotomill
