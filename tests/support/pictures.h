#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "picture/picture_record.h"

namespace fotomill::test {

// A picture with an image, in black and white, with the gray ramp
// or in color. `rows` are its rows from the top in image layout,
// each cut or zero-padded to the stride; missing ones are zero.
PicturePointer MakePicture(int32_t width, int32_t height, int32_t bitsPerPixel,
                           const std::vector<std::vector<uint8_t>>& rows = {});

// The bytes of row y from the top, without padding.
std::vector<uint8_t> RowOf(const PackedImage& image, int32_t y);
// All rows from the top, concatenated.
std::vector<uint8_t> RowsOf(const PackedImage& image);

// `count` pseudorandom bytes, the same in every run.
std::vector<uint8_t> RandomBytes(size_t count, uint32_t seed);

}  // namespace fotomill::test
