// The block compressions of DDS: squares of 4 x 4 pixels in 8 or 16 bytes.
// Source: Microsoft, "Texture Block Compression in Direct3D 11" and "BC7 Format Mode Reference";
// Khronos Data Format Specification 1.3, chapters S3TC, RGTC and BPTC.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace dds {

// Blue, green, red, alpha.
using Pixel = std::array<uint8_t, 4>;
using Square = std::array<Pixel, 16>;  // from the top left, by rows

// Each decodes a block of 8 (BC1, BC4) or 16 bytes.
void DecodeBc1(const uint8_t* block, Square& square);
void DecodeBc2(const uint8_t* block, Square& square);
void DecodeBc3(const uint8_t* block, Square& square);
void DecodeBc4(const uint8_t* block, Square& square);
void DecodeBc4Signed(const uint8_t* block, Square& square);
void DecodeBc5(const uint8_t* block, Square& square);
void DecodeBc5Signed(const uint8_t* block, Square& square);
void DecodeBc7(const uint8_t* block, Square& square);

}  // namespace dds
