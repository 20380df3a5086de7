#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/packed_image.h"
#include "platform/memory.h"

namespace fotomill {

// The rows of an image for filters that look at neighbors: a row has `reach` more pixels to the
// left and to the right, and there are `reach` more rows above and below, all of which repeat the
// edge. The last 2 x reach + 1 rows are kept, so that a filter that goes down row by row copies
// each row once. For 24-bit images (three bytes per pixel) and for alpha planes and other 8-bit
// images (one byte). One object a band. The image must outlive it and not change.
class PaddedRows {
 public:
  // UnsuitableImage for images of 1 or 4 bits, MemoryAllocationError without room.
  Status Open(const PackedImage& image, int32_t reach);
  // Pixel (0, y); columns from -reach to width + reach - 1 may be read from there. y may be `reach`
  // rows outside. Good as long as no row is asked for that is more than 2 x reach away.
  const uint8_t* Row(int32_t y);

 private:
  const PackedImage* image_ = nullptr;
  int32_t reach_ = 0, kept_ = 0;
  size_t pixel_ = 3, stride_ = 0;
  platform::MemoryBlock rows_, held_;  // `kept_` padded rows, and which row each is
};

}  // namespace fotomill
