#pragma once

#include <cstdint>

namespace fotomill {

// value / 255, rounded down, for values below 65535, in 16-bit arithmetic.
constexpr uint16_t DivideBy255(uint16_t value) {
  const auto next = static_cast<uint16_t>(value + 1);
  return static_cast<uint16_t>((next + (next >> 8)) >> 8);
}

// (background x (255 - alpha) + pixel x alpha) / 255, rounded to nearest.
constexpr uint8_t Blend(uint8_t background, uint8_t pixel, uint8_t alpha) {
  return static_cast<uint8_t>(
      DivideBy255(static_cast<uint16_t>(background * (255 - alpha) + pixel * alpha + 127)));
}

}  // namespace fotomill
