#pragma once

#include "operations/gravity.h"
#include "operations/parameter.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// The rectangle that a parameter of that kind means within a picture of size `whole`, in whole
// pixels. One with a place may be outside; a size or a ratio is placed by gravity and stays inside.
Rectangle AreaOf(const Value& area, Size whole, const PictureMetadata& metadata,
                 Gravity gravity = Gravity::Center);

// The point that a parameter of that kind means, in pixels from the top left corner.
struct AreaPoint {
  double x, y;
};
AreaPoint PointOf(const Value& point, Size whole, const PictureMetadata& metadata);

}  // namespace fotomill
