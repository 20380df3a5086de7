#pragma once

#include "operations/parameter.h"
#include "processing/geometry/canvas.h"

namespace fotomill {

// Converts a parameter's color for kernels.
constexpr Backdrop BackdropOf(const AlphaColor& color) {
  return {color.blue, color.green, color.red, color.alpha};
}

// Converts a percentage to alpha, rounded to nearest.
constexpr uint8_t AlphaOfPercent(double percent) {
  return static_cast<uint8_t>(percent * 255 / 100 + 0.5);
}

}  // namespace fotomill
