#pragma once

#include "operations/parameter.h"
#include "processing/geometry/canvas.h"

namespace fotomill {

// A parameter's color as kernels take it.
constexpr Backdrop BackdropOf(const AlphaColor& color) {
  return {color.blue, color.green, color.red, color.alpha};
}

}  // namespace fotomill
