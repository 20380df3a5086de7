#include "blocks.h"

#include <algorithm>

#include "fotomill_plugin_kit.h"

namespace dds {

namespace {

Pixel Expand565(uint32_t color) {
  const uint32_t red = color >> 11, green = color >> 5 & 63, blue = color & 31;
  return {static_cast<uint8_t>(blue << 3 | blue >> 2),
          static_cast<uint8_t>(green << 2 | green >> 4), static_cast<uint8_t>(red << 3 | red >> 2),
          255};
}

Pixel Between(const Pixel& one, const Pixel& other, uint32_t parts, uint32_t all) {
  Pixel mixed = {0, 0, 0, 255};
  for (size_t i = 0; i < 3; ++i)
    mixed[i] = static_cast<uint8_t>((one[i] * (all - parts) + other[i] * parts) / all);
  return mixed;
}

// The colors of a block: two ends and what lies between them. With `mayBeClear`, the fourth color
// is transparent if the first end is not above the second one.
void DecodeColors(const uint8_t* block, bool mayBeClear, Square& square) {
  const uint32_t first = FmwGetLe(block, 2), second = FmwGetLe(block + 2, 2);
  const uint32_t choices = FmwGetLe(block + 4, 4);
  std::array<Pixel, 4> colors = {Expand565(first), Expand565(second)};
  if (first > second || !mayBeClear) {
    colors[2] = Between(colors[0], colors[1], 1, 3);
    colors[3] = Between(colors[0], colors[1], 2, 3);
  } else {
    colors[2] = Between(colors[0], colors[1], 1, 2);
    colors[3] = {0, 0, 0, 0};
  }
  for (size_t i = 0; i < square.size(); ++i) square[i] = colors[choices >> 2 * i & 3];
}

// Two ends and what lies between them; if the first is not above the second, there are 4 values
// between them, and the least and the most of the range. Ends of a signed block are -127 to 127.
std::array<uint8_t, 16> DecodeSamples(const uint8_t* block, bool isSigned) {
  // counted from the least value of the range
  const auto end = [&](uint8_t byte) {
    return isSigned ? std::max<int32_t>(static_cast<int8_t>(byte), -127) + 127 : int32_t{byte};
  };
  const auto sample = [&](int32_t sum, int32_t parts) {
    return static_cast<uint8_t>(isSigned ? (sum * 255 + 127 * parts) / (254 * parts) : sum / parts);
  };
  const int32_t first = end(block[0]), second = end(block[1]);
  const int32_t parts = first > second ? 7 : 5;
  std::array<uint8_t, 8> values = {sample(first, 1), sample(second, 1), 0, 0, 0, 0, 0, 255};
  for (int32_t i = 1; i < parts; ++i)
    values[static_cast<size_t>(i) + 1] = sample((parts - i) * first + i * second, parts);
  const uint64_t choices = FmwGetLe(block + 2, 3) | uint64_t{FmwGetLe(block + 5, 3)} << 24;
  std::array<uint8_t, 16> samples;
  for (size_t i = 0; i < samples.size(); ++i) samples[i] = values[choices >> 3 * i & 7];
  return samples;
}

void DecodeGray(const uint8_t* block, bool isSigned, Square& square) {
  const auto samples = DecodeSamples(block, isSigned);
  for (size_t i = 0; i < square.size(); ++i) square[i] = {samples[i], samples[i], samples[i], 255};
}

// Red and green, as of normals; blue is black.
void DecodeTwo(const uint8_t* block, bool isSigned, Square& square) {
  const auto red = DecodeSamples(block, isSigned), green = DecodeSamples(block + 8, isSigned);
  for (size_t i = 0; i < square.size(); ++i) square[i] = {0, green[i], red[i], 255};
}

}  // namespace

void DecodeBc1(const uint8_t* block, Square& square) { DecodeColors(block, true, square); }

void DecodeBc2(const uint8_t* block, Square& square) {
  DecodeColors(block + 8, false, square);
  for (size_t i = 0; i < square.size(); ++i)
    square[i][3] = static_cast<uint8_t>((block[i / 2] >> 4 * (i % 2) & 15) * 17);
}

void DecodeBc3(const uint8_t* block, Square& square) {
  DecodeColors(block + 8, false, square);
  const auto alpha = DecodeSamples(block, false);
  for (size_t i = 0; i < square.size(); ++i) square[i][3] = alpha[i];
}

void DecodeBc4(const uint8_t* block, Square& square) { DecodeGray(block, false, square); }
void DecodeBc4Signed(const uint8_t* block, Square& square) { DecodeGray(block, true, square); }
void DecodeBc5(const uint8_t* block, Square& square) { DecodeTwo(block, false, square); }
void DecodeBc5Signed(const uint8_t* block, Square& square) { DecodeTwo(block, true, square); }

}  // namespace dds
