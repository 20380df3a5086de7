#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/packed_image.h"
#include "platform/memory.h"

namespace fotomill {

// Rows of an image for filters that look at neighbors: padded by `reach` pixels on the left and
// right, and by `reach` rows above and below, by repeating the edge. The last 2 x reach + 1 rows
// are cached, so that a top-down filter copies each row once. For 24-bit images (three bytes per
// pixel), alpha planes and other 8-bit images (one byte). One object per band. The image must
// outlive it and not change.
class PaddedRows {
 public:
  // UnsuitableImage for images of 1 or 4 bits, or MemoryAllocationError.
  Status Open(const PackedImage& image, int32_t reach);
  // Pixel (0, y); readable from column -reach to width + reach - 1. y may be up to `reach` rows
  // outside. Valid until a row more than 2 x reach away is requested.
  const uint8_t* Row(int32_t y);

 private:
  const PackedImage* image_ = nullptr;
  int32_t reach_ = 0, kept_ = 0;
  size_t pixel_ = 3, stride_ = 0;
  platform::MemoryBlock rows_, held_;  // `kept_` padded rows, and their row numbers
};

}  // namespace fotomill
