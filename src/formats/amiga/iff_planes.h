#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// Rows of bit planes, as ILBM has them: planes of `planeSize` bytes, the first for the lowest bit,
// pixels from the highest bit of a byte down.

// Merges up to eight planes into one byte a pixel; `pixels` may be shorter than the planes are.
void MergeIffPlanes(const uint8_t* planes, size_t planeSize, int32_t count,
                    std::span<uint8_t> pixels);
// Splits them again; bits behind the last pixel are 0.
void SplitIffPlanes(std::span<const uint8_t> pixels, size_t planeSize, int32_t count,
                    uint8_t* planes);

// Pixels of hold-and-modify: the two highest of `bits` bits (5 to 8) tell whether the others are an
// index of the palette of `colors` (RGB), or replace blue, red or green of the pixel to the left.
// `bgr` gets three bytes a pixel.
void DecodeHam(std::span<const uint8_t> pixels, int32_t bits, const uint8_t* colors, uint8_t* bgr);

}  // namespace fotomill
