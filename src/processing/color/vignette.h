#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/color/mix.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// Fades the edges of a picture to a color.
struct Vignette {
  double amount = 0.5;  // opacity of the color in the corners, 0 to 1
  // unaffected part of the radius, 0 to below 1
  double size = 0.4;
  BgrColor color{};
  // For a part of a picture: the position of its pixel (0, 0) in the whole, and the whole's size.
  int32_t left = 0, top = 0;
  Size whole{0, 0};
};

// With r the elliptical distance from the center, 1 in the corners, and s = (r - size) / (1 - size)
// clamped to 0 to 1, v becomes v + (color - v) amount s^2 (3 - 2 s). The picture is converted to 24
// bits; alpha is unchanged. Statuses as NewPackedImage, and FunctionCancelled (4).
Status ApplyVignette(PictureRecord& picture, const Vignette& vignette, const Work& work);

}  // namespace fotomill
