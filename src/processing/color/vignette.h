#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/color/mix.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// Edges of a picture that fade into a color.
struct Vignette {
  double amount = 0.5;  // share of the color in the corners, 0 to 1
  // share of the way from the center to the corners that stays as it is, 0 to below 1
  double size = 0.4;
  BgrColor color{};
  // The picture may be a part: the place of its pixel (0, 0) in the whole, and the whole's size.
  int32_t left = 0, top = 0;
  Size whole{0, 0};
};

// With r the distance from the center, 1 in the corners of the picture measured as an ellipse, and
// s = (r - size) / (1 - size) cut to 0 to 1, v becomes v + (color - v) amount s^2 (3 - 2 s). The
// picture gets 24 bits; alpha stays. Statuses as NewPackedImage, and FunctionCancelled (4).
Status ApplyVignette(PictureRecord& picture, const Vignette& vignette, const Work& work);

}  // namespace fotomill
