#pragma once

#include <cstdint>
#include <vector>

namespace fotomill::test {

// A bitmap file: 1, 8 or 24 bits, its pixels in stripes of two colors.
std::vector<uint8_t> BitmapFile(int32_t width, int32_t height, int32_t bits);

}  // namespace fotomill::test
