#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/palette.h"
#include "platform/memory.h"

namespace fotomill {

// Answers which of a palette's colours is nearest to a given one, by squared distance. Answers are kept for cells of
// 4 x 4 x 4 colours, each worked out for its middle when first asked for.
class NearestColor {
 public:
  // The first `count` colours of the palette, 1 to 256. MemoryAllocationError.
  Status Open(const Palette& palette, int32_t count);
  uint8_t Find(int32_t blue, int32_t green, int32_t red) {
    const int32_t cell = (red >> 2) << 12 | (green >> 2) << 6 | blue >> 2;
    const uint16_t known = cells_[cell];
    return static_cast<uint8_t>(known != 0 ? known - 1 : Search(cell));
  }
  // Blue, green and red of an index.
  const int16_t* ColorOf(uint8_t index) const { return colors_[index]; }

 private:
  uint8_t Search(int32_t cell);

  platform::MemoryBlock block_;
  uint16_t* cells_ = nullptr;  // index + 1, 0 where not yet known
  int32_t count_ = 0;
  int16_t colors_[256][4] = {};
};

}  // namespace fotomill
