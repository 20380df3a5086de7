#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "picture/picture_record.h"

namespace fotomill::test {

// A picture with an image, black and white, in the gray ramp or in color. `rows` are its rows from
// the top as they lie in the image, each cut or filled with zeros to the stride; missing ones are
// zero.
PicturePointer MakePicture(int32_t width, int32_t height, int32_t bitsPerPixel,
                           const std::vector<std::vector<uint8_t>>& rows = {});

// The bytes of row y from the top, without its padding.
std::vector<uint8_t> RowOf(const PackedImage& image, int32_t y);
// All rows from the top, one after the other.
std::vector<uint8_t> RowsOf(const PackedImage& image);

// `count` bytes that look random and are the same in every run.
std::vector<uint8_t> RandomBytes(size_t count, uint32_t seed);

}  // namespace fotomill::test
