#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Rows of pixels taken apart and put together, as codecs need it between a file's order and that of
// a packed image. `count` is in pixels, rows do not overlap, and no byte beyond `count` pixels is
// read or written.

// Pixels of blue, green, red into one plane for each color, and back.
void SplitColors(const uint8_t* bgr, size_t count, uint8_t* blue, uint8_t* green, uint8_t* red);
// And back.
void MergeColors(const uint8_t* blue, const uint8_t* green, const uint8_t* red, size_t count,
                 uint8_t* bgr);

// Pixels of blue, green, red to red, green, blue, or the other way round.
void SwapColors(const uint8_t* source, size_t count, uint8_t* target);

// Pixels of blue, green, red and a fourth byte into pixels without it, and a plane of the fourth
// bytes; back again.
void DropFourth(const uint8_t* bgrx, size_t count, uint8_t* bgr);
// The fourth byte is alpha.
void SplitAlpha(const uint8_t* bgra, size_t count, uint8_t* bgr, uint8_t* alpha);
void MergeAlpha(const uint8_t* bgr, const uint8_t* alpha, size_t count, uint8_t* bgra);  // and back

// Pixels of 4 bits into `planes` bit planes (at most 4) of `planeSize` bytes one after the other,
// the first for the lowest bit, and back. Rows of 4-bit pixels are whole groups of 4 bytes; bits
// beyond `count` come out as 0.
void SplitBitPlanes(const uint8_t* row, size_t count, int planes, size_t planeSize, uint8_t* bits);
// And back.
void MergeBitPlanes(const uint8_t* bits, size_t count, int planes, size_t planeSize, uint8_t* row);

}  // namespace fotomill
