#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Conversions between the pixel layouts of files and of packed
// images, by row. `count` is in pixels, rows must not overlap,
// and nothing beyond `count` pixels is read or written.

// Splits blue, green, red pixels into one plane per color.
void SplitColors(const uint8_t* bgr, size_t count, uint8_t* blue, uint8_t* green, uint8_t* red);
// The reverse.
void MergeColors(const uint8_t* blue, const uint8_t* green, const uint8_t* red, size_t count,
                 uint8_t* bgr);

// Converts blue, green, red to red, green, blue, or the reverse.
void SwapColors(const uint8_t* source, size_t count, uint8_t* target);

// Removes the fourth byte of every pixel.
void DropFourth(const uint8_t* bgrx, size_t count, uint8_t* bgr);
// Splits off the fourth byte of every pixel as an alpha plane.
void SplitAlpha(const uint8_t* bgra, size_t count, uint8_t* bgr, uint8_t* alpha);
void MergeAlpha(const uint8_t* bgr, const uint8_t* alpha, size_t count, uint8_t* bgra);  // reverse

// Splits 4-bit pixels into `planes` bit planes (at most 4) of
// `planeSize` bytes each, lowest bit first. Rows of 4-bit pixels
// are padded to 4 bytes; bits beyond `count` are set to 0.
void SplitBitPlanes(const uint8_t* row, size_t count, int planes, size_t planeSize, uint8_t* bits);
// The reverse.
void MergeBitPlanes(const uint8_t* bits, size_t count, int planes, size_t planeSize, uint8_t* row);

}  // namespace fotomill
