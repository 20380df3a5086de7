#pragma once

#include "operations/parameter.h"
#include "processing/geometry/canvas.h"

namespace fotomill {

// A parameter's color as kernels take it.
constexpr Backdrop BackdropOf(const AlphaColor& color) {
  return {color.blue, color.green, color.red, color.alpha};
}

// A percentage as an alpha value, rounded to nearest.
constexpr uint8_t AlphaOfPercent(double percent) {
  return static_cast<uint8_t>(percent * 255 / 100 + 0.5);
}

}  // namespace fotomill
