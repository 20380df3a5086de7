#include "formats/amiga/iff_planes.h"

#include <algorithm>
#include <array>
#include <cstring>

namespace fotomill {

namespace {

using Spread = std::array<std::array<uint8_t, 8>, 256>;

// The bits of each byte, expanded to bytes of 0 or 1, highest first.
constexpr Spread MakeSpread() {
  Spread spread{};
  for (size_t byte = 0; byte < spread.size(); ++byte) {
    for (size_t i = 0; i < 8; ++i) spread[byte][i] = static_cast<uint8_t>(byte >> (7 - i) & 1);
  }
  return spread;
}

constexpr Spread kSpread = MakeSpread();

uint64_t SpreadBits(uint8_t byte) {
  uint64_t bits;
  std::memcpy(&bits, kSpread[byte].data(), 8);
  return bits;
}

}  // namespace

void MergeIffPlanes(const uint8_t* planes, size_t planeSize, int32_t count,
                    std::span<uint8_t> pixels) {
  for (size_t x = 0; x < pixels.size(); x += 8) {
    uint64_t eight = 0;
    for (int32_t p = 0; p < count; ++p)
      eight |= SpreadBits(planes[static_cast<size_t>(p) * planeSize + x / 8]) << p;
    std::memcpy(&pixels[x], &eight, std::min<size_t>(8, pixels.size() - x));
  }
}

void SplitIffPlanes(std::span<const uint8_t> pixels, size_t planeSize, int32_t count,
                    uint8_t* planes) {
  std::memset(planes, 0, planeSize * static_cast<size_t>(count));
  for (size_t x = 0; x < pixels.size(); x += 8) {
    std::array<uint8_t, 8> eight{};
    std::memcpy(eight.data(), &pixels[x], std::min<size_t>(8, pixels.size() - x));
    for (int32_t p = 0; p < count; ++p) {
      uint32_t byte = 0;
      for (const uint8_t pixel : eight) byte = byte << 1 | (pixel >> p & 1u);
      planes[static_cast<size_t>(p) * planeSize + x / 8] = static_cast<uint8_t>(byte);
    }
  }
}

void DecodeHam(std::span<const uint8_t> pixels, int32_t bits, const uint8_t* colors, uint8_t* bgr) {
  const int32_t valueBits = bits > 6 ? 6 : 4;
  const uint8_t mask = static_cast<uint8_t>((1 << valueBits) - 1);
  uint8_t color[3] = {colors[2], colors[1], colors[0]};
  // the channel (blue, green, red) replaced by control values 1 to 3
  constexpr size_t kPlace[] = {0, 0, 2, 1};
  for (const uint8_t pixel : pixels) {
    const uint8_t value = pixel & mask;
    const int32_t control = pixel >> valueBits & 3;
    if (control == 0) {
      for (size_t c = 0; c < 3; ++c) color[c] = colors[3 * value + 2 - c];
    } else {
      const int32_t high = value << (8 - valueBits);
      color[kPlace[control]] = static_cast<uint8_t>(high | high >> valueBits);
    }
    std::copy_n(color, 3, bgr);
    bgr += 3;
  }
}

}  // namespace fotomill
