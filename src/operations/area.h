#pragma once

#include "operations/gravity.h"
#include "operations/parameter.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// The rectangle of a rectangle parameter in a picture of size `whole`, in whole pixels. One with a
// position may be outside; a size or ratio is placed by gravity and stays inside.
Rectangle AreaOf(const Value& area, Size whole, const PictureMetadata& metadata,
                 Gravity gravity = Gravity::Center);

// The point given by a point parameter, in pixels from the top left corner.
struct AreaPoint {
  double x, y;
};
AreaPoint PointOf(const Value& point, Size whole, const PictureMetadata& metadata);

}  // namespace fotomill
