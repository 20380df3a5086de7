#include "processing/nearest_color.h"

namespace fotomill {

Status NearestColor::Open(const Palette& palette, int32_t count) {
  if (!block_.Allocate(sizeof(uint16_t) << 18)) return Status::MemoryAllocationError;
  cells_ = block_.Items<uint16_t>().data();
  count_ = count;
  for (int32_t i = 0; i < count; ++i) {
    for (int32_t c = 0; c < 3; ++c) colors_[i][c] = palette[static_cast<size_t>(3 * i + 2 - c)];
  }
  return Status::Ok;
}

uint8_t NearestColor::Search(int32_t cell) {
  const int32_t blue = (cell & 63) << 2 | 2, green = (cell >> 6 & 63) << 2 | 2, red = cell >> 12 << 2 | 2;
  int32_t best = 0, bestDistance = INT32_MAX;
  for (int32_t i = 0; i < count_; ++i) {
    const int32_t b = colors_[i][0] - blue, g = colors_[i][1] - green, r = colors_[i][2] - red;
    const int32_t distance = b * b + g * g + r * r;
    if (distance < bestDistance) {
      bestDistance = distance;
      best = i;
    }
  }
  cells_[cell] = static_cast<uint16_t>(best + 1);
  return static_cast<uint8_t>(best);
}

}  // namespace fotomill
