#pragma once

#include <cstdint>
#include <vector>

#include "core/status.h"
#include "picture/packed_image.h"

namespace fotomill {

// Encodes a 24-bit image as a baseline JPEG file in memory, without metadata. `quality` is 1 to
// 100; from 90 on, chroma keeps its full resolution. MemoryAllocationError, UnsuitableImage for an
// image that is too large for the format or not of 24 bits.
Status EncodeJpeg(const PackedImage& image, int32_t quality, std::vector<uint8_t>& bytes);

}  // namespace fotomill
