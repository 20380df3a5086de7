#pragma once

#include <cstdint>

#include "processing/color/point_effect.h"

namespace fotomill {

// Brightness of a color as television defines it: 0.299 R + 0.587 G + 0.114 B, rounded to nearest.
// Source: ITU-R BT.601-7, section 2.5.1.
constexpr uint8_t Luma(uint8_t red, uint8_t green, uint8_t blue) {
  return static_cast<uint8_t>((299 * red + 587 * green + 114 * blue + 500) / 1000);
}

// v + 2.55 b, for b from -100 to 100.
PointEffect BrightnessEffect(double b);
// (v - 127.5) k + 127.5 with k = tan((c + 100) pi / 400), for c from -100 (all gray) to 100 (black and white).
PointEffect ContrastEffect(double c);
// 255 (v / 255)^(1 / g), for g above 0.
PointEffect GammaEffect(double g);
// 255 - v.
PointEffect InvertEffect();
// Every channel becomes the luma.
PointEffect GrayEffect();

}  // namespace fotomill
