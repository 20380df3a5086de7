#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// Rows of ILBM bit planes: planes of `planeSize` bytes, lowest bit first, the leftmost pixel in a
// byte's highest bit.

// Merges up to eight planes into one byte per pixel; `pixels` may be shorter than the planes.
void MergeIffPlanes(const uint8_t* planes, size_t planeSize, int32_t count,
                    std::span<uint8_t> pixels);
// The reverse; padding bits are 0.
void SplitIffPlanes(std::span<const uint8_t> pixels, size_t planeSize, int32_t count,
                    uint8_t* planes);

// Decodes hold-and-modify pixels: the two highest of `bits` bits (5 to 8) say whether the rest is
// an index into the palette `colors` (RGB), or replaces blue, red or green of the pixel to the
// left. `bgr` receives three bytes per pixel.
void DecodeHam(std::span<const uint8_t> pixels, int32_t bits, const uint8_t* colors, uint8_t* bgr);

}  // namespace fotomill
