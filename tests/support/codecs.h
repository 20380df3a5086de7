#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "registry/registry.h"

namespace fotomill::test {

// A request to read a file with the current settings.
ReadRequest RequestFor(const std::string& fileName);

// Result of decoding a file with these bytes.
struct Decoded {
  Status status;
  PicturePointer picture;
};
Decoded Describe(InfoOperation info, std::span<const uint8_t> file);
Decoded Decode(ReadOperation read, std::span<const uint8_t> file);

// The bytes that a writer produces for a picture with the current settings; empty on failure, with
// `status` set.
std::vector<uint8_t> Encode(WriteOperation write, PictureRecord& picture, Status* status = nullptr);

// Pixels from the top, separated by spaces, rows by " / ": decimal indices, or RRGGBB in hex. Empty
// without an image.
std::string PixelText(const PackedImage& image);

// A patterned but reproducible picture of that depth: runs, single values, and every index. One-bit
// palettes are black and white. Padding bits are 0.
PicturePointer PatternPicture(int32_t width, int32_t height, int32_t bitsPerPixel);

// Whether both images have the same size, depth and pixels; padding is ignored.
bool SamePixels(const PackedImage& a, const PackedImage& b);

// Sets one pixel: an index, or 0x00RRGGBB.
void SetPixel(PackedImage& image, int32_t x, int32_t y, int32_t value);

}  // namespace fotomill::test
