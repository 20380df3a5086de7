#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "registry/registry.h"

namespace fotomill::test {

// A file, to be read as the settings in force say.
ReadRequest RequestFor(const std::string& fileName);

// What an operation made of a file of these bytes.
struct Decoded {
  Status status;
  PicturePointer picture;
};
Decoded Describe(InfoOperation info, std::span<const uint8_t> file);
Decoded Decode(ReadOperation read, std::span<const uint8_t> file);

// The bytes that a writer makes of a picture as the settings in force say; empty when it fails,
// with its status in `status`.
std::vector<uint8_t> Encode(WriteOperation write, PictureRecord& picture, Status* status = nullptr);

// Pixels from the top, values by spaces and rows by " / ": decimal indices, or RRGGBB in
// hexadecimal. Empty without an image.
std::string PixelText(const PackedImage& image);

// A picture of that depth whose pixels and palette are patterned but fixed: runs, single values,
// and every index. Palettes of one bit are black and white. Padding bits are 0.
PicturePointer PatternPicture(int32_t width, int32_t height, int32_t bitsPerPixel);

// Whether both images have the same size, depth and pixels; padding does not count.
bool SamePixels(const PackedImage& a, const PackedImage& b);

// Sets one pixel: an index, or 0x00RRGGBB.
void SetPixel(PackedImage& image, int32_t x, int32_t y, int32_t value);

}  // namespace fotomill::test
