// BC7: a block has one of eight modes, which say how its 128 bits are shared out.
#include <algorithm>
#include <bit>
#include <utility>

#include "blocks.h"
#include "fotomill_plugin_kit.h"

namespace dds {

namespace {

struct Mode {
  uint32_t subsets, partitionBits, rotationBits, selectorBits, colorBits, alphaBits;
  uint32_t endBits, sharedBits;  // a lowest bit for each end, for both ends of a subset
  uint32_t indexBits, secondIndexBits;
};
constexpr Mode kModes[8] = {
    {3, 4, 0, 0, 4, 0, 1, 0, 3, 0}, {2, 6, 0, 0, 6, 0, 0, 1, 3, 0}, {3, 6, 0, 0, 5, 0, 0, 0, 2, 0},
    {2, 6, 0, 0, 7, 0, 1, 0, 2, 0}, {1, 0, 2, 1, 5, 6, 0, 0, 2, 3}, {1, 0, 2, 0, 7, 8, 0, 0, 2, 2},
    {1, 0, 0, 0, 7, 7, 1, 0, 4, 0}, {2, 6, 0, 0, 5, 5, 1, 0, 2, 0},
};

// The subset of each pixel, from the lowest bit: a bit a pixel for two subsets, two for three.
constexpr uint16_t kTwoSubsets[64] = {
    0xcccc, 0x8888, 0xeeee, 0xecc8, 0xc880, 0xfeec, 0xfec8, 0xec80, 0xc800, 0xffec, 0xfe80,
    0xe800, 0xffe8, 0xff00, 0xfff0, 0xf000, 0xf710, 0x008e, 0x7100, 0x08ce, 0x008c, 0x7310,
    0x3100, 0x8cce, 0x088c, 0x3110, 0x6666, 0x366c, 0x17e8, 0x0ff0, 0x718e, 0x399c, 0xaaaa,
    0xf0f0, 0x5a5a, 0x33cc, 0x3c3c, 0x55aa, 0x9696, 0xa55a, 0x73ce, 0x13c8, 0x324c, 0x3bdc,
    0x6996, 0xc33c, 0x9966, 0x0660, 0x0272, 0x04e4, 0x4e40, 0x2720, 0xc936, 0x936c, 0x39c6,
    0x639c, 0x9336, 0x9cc6, 0x817e, 0xe718, 0xccf0, 0x0fcc, 0x7744, 0xee22,
};
constexpr uint32_t kThreeSubsets[64] = {
    0xaa685050, 0x6a5a5040, 0x5a5a4200, 0x5450a0a8, 0xa5a50000, 0xa0a05050, 0x5555a0a0, 0x5a5a5050,
    0xaa550000, 0xaa555500, 0xaaaa5500, 0x90909090, 0x94949494, 0xa4a4a4a4, 0xa9a59450, 0x2a0a4250,
    0xa5945040, 0x0a425054, 0xa5a5a500, 0x55a0a0a0, 0xa8a85454, 0x6a6a4040, 0xa4a45000, 0x1a1a0500,
    0x0050a4a4, 0xaaa59090, 0x14696914, 0x69691400, 0xa08585a0, 0xaa821414, 0x50a4a450, 0x6a5a0200,
    0xa9a58000, 0x5090a0a8, 0xa8a09050, 0x24242424, 0x00aa5500, 0x24924924, 0x24499224, 0x50a50a50,
    0x500aa550, 0xaaaa4444, 0x66660000, 0xa5a0a5a0, 0x50a050a0, 0x69286928, 0x44aaaa44, 0x66666600,
    0xaa444444, 0x54a854a8, 0x95809580, 0x96969600, 0xa85454a8, 0x80959580, 0xaa141414, 0x96960000,
    0xaaaa1414, 0xa05050a0, 0xa0a5a5a0, 0x96000000, 0x40804080, 0xa9a8a9a8, 0xaaaaaa44, 0x2a4a5254,
};

// The pixel of each subset but the first whose index has its highest bit left out, which is 0.
constexpr uint8_t kAnchorOfTwo[64] = {
    15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 2,  8, 2,  2, 8,
    8,  15, 2,  8,  2,  2,  8,  8,  2,  2,  15, 15, 6,  8,  2,  8,  15, 15, 2, 8,  2, 2,
    2,  15, 15, 6,  6,  2,  6,  8,  15, 15, 2,  2,  15, 15, 15, 15, 15, 2,  2, 15,
};
constexpr uint8_t kSecondAnchor[64] = {
    3,  3,  15, 15, 8, 3,  15, 15, 8,  8,  6, 6,  6, 5,  3, 3,  3,  3,  8,  15, 3,  3,
    6,  10, 5,  8,  8, 6,  8,  5,  15, 15, 8, 15, 3, 5,  6, 10, 8,  15, 15, 3,  15, 5,
    15, 15, 15, 15, 3, 15, 5,  5,  5,  8,  5, 10, 5, 10, 8, 13, 15, 12, 3,  3,
};
constexpr uint8_t kThirdAnchor[64] = {
    15, 8, 8, 3,  15, 15, 3,  8,  15, 15, 15, 15, 15, 15, 15, 8,  15, 8,  15, 3,  15, 8,
    15, 8, 3, 15, 6,  10, 15, 15, 10, 8,  15, 3,  15, 10, 10, 8,  9,  10, 6,  15, 8,  15,
    3,  6, 6, 8,  15, 3,  15, 15, 15, 15, 15, 15, 15, 15, 15, 15, 3,  15, 15, 8,
};

// How much of the second end an index takes, of 64.
constexpr uint8_t kWeights2[] = {0, 21, 43, 64};
constexpr uint8_t kWeights3[] = {0, 9, 18, 27, 37, 46, 55, 64};
constexpr uint8_t kWeights4[] = {0, 4, 9, 13, 17, 21, 26, 30, 34, 38, 43, 47, 51, 55, 60, 64};
constexpr const uint8_t* kWeights[] = {nullptr, nullptr, kWeights2, kWeights3, kWeights4};

class Bits {
 public:
  explicit Bits(const uint8_t* block)
      : low_(FmwGetLe(block, 4) | uint64_t{FmwGetLe(block + 4, 4)} << 32),
        high_(FmwGetLe(block + 8, 4) | uint64_t{FmwGetLe(block + 12, 4)} << 32) {}
  uint32_t Take(uint32_t count) {
    const auto value = static_cast<uint32_t>(low_ & ((uint64_t{1} << count) - 1));
    if (count > 0) {
      low_ = low_ >> count | high_ << (64 - count);
      high_ >>= count;
    }
    return value;
  }

 private:
  uint64_t low_, high_;
};

// The ends of up to three subsets, by component: red, green, blue, alpha.
using Ends = std::array<std::array<uint32_t, 4>, 6>;

// A value of some bits as one of 8, its highest bits repeated.
uint32_t Widened(uint32_t value, uint32_t bits) {
  value <<= 8 - bits;
  return value | value >> bits;
}

Ends TakeEnds(const Mode& mode, Bits& bits) {
  Ends ends = {};
  const uint32_t count = 2 * mode.subsets, components = mode.alphaBits > 0 ? 4 : 3;
  for (uint32_t c = 0; c < components; ++c) {
    for (uint32_t i = 0; i < count; ++i)
      ends[i][c] = bits.Take(c < 3 ? mode.colorBits : mode.alphaBits);
  }
  const bool more = mode.endBits + mode.sharedBits > 0;
  uint32_t lowest = 0;
  for (uint32_t i = 0; i < count; ++i) {
    if (mode.endBits > 0 || (mode.sharedBits > 0 && i % 2 == 0)) lowest = bits.Take(1);
    for (uint32_t c = 0; c < components && more; ++c) ends[i][c] = ends[i][c] << 1 | lowest;
  }
  for (uint32_t i = 0; i < count; ++i) {
    for (uint32_t c = 0; c < 3; ++c) ends[i][c] = Widened(ends[i][c], mode.colorBits + more);
    ends[i][3] = mode.alphaBits > 0 ? Widened(ends[i][3], mode.alphaBits + more) : 255;
  }
  return ends;
}

uint32_t SubsetOf(const Mode& mode, uint32_t partition, uint32_t pixel) {
  if (mode.subsets == 2) return kTwoSubsets[partition] >> pixel & 1;
  return mode.subsets == 3 ? kThreeSubsets[partition] >> 2 * pixel & 3 : 0;
}

bool IsAnchor(const Mode& mode, uint32_t partition, uint32_t pixel) {
  if (pixel == 0) return true;
  if (mode.subsets == 2) return pixel == kAnchorOfTwo[partition];
  return mode.subsets == 3 &&
         (pixel == kSecondAnchor[partition] || pixel == kThirdAnchor[partition]);
}

uint8_t Mixed(uint32_t one, uint32_t other, uint32_t weight) {
  return static_cast<uint8_t>((one * (64 - weight) + other * weight + 32) / 64);
}

}  // namespace

void DecodeBc7(const uint8_t* block, Square& square) {
  const auto number = static_cast<uint32_t>(std::countr_zero(static_cast<uint8_t>(block[0])));
  if (number > 7) {
    square.fill({0, 0, 0, 0});
    return;
  }
  const Mode& mode = kModes[number];
  Bits bits(block);
  (void)bits.Take(number + 1);
  const uint32_t partition = bits.Take(mode.partitionBits);
  const uint32_t rotation = bits.Take(mode.rotationBits);
  const bool swapped = bits.Take(mode.selectorBits) != 0;
  const Ends ends = TakeEnds(mode, bits);
  std::array<uint32_t, 16> first = {}, second = {};
  for (uint32_t i = 0; i < 16; ++i)
    first[i] = bits.Take(mode.indexBits - (IsAnchor(mode, partition, i) ? 1 : 0));
  for (uint32_t i = 0; i < 16 && mode.secondIndexBits > 0; ++i)
    second[i] = bits.Take(mode.secondIndexBits - (i == 0 ? 1 : 0));
  for (uint32_t i = 0; i < 16; ++i) {
    const uint32_t subset = SubsetOf(mode, partition, i);
    const auto &one = ends[2 * subset], &other = ends[2 * subset + 1];
    uint32_t color = kWeights[mode.indexBits][first[i]], alpha = color;
    if (mode.secondIndexBits > 0) alpha = kWeights[mode.secondIndexBits][second[i]];
    if (swapped) std::swap(color, alpha);
    square[i] = {Mixed(one[2], other[2], color), Mixed(one[1], other[1], color),
                 Mixed(one[0], other[0], color), Mixed(one[3], other[3], alpha)};
    if (rotation > 0) std::swap(square[i][3], square[i][3 - rotation]);
  }
}

}  // namespace dds
