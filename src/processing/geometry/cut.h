#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// The part of `area` that is on a picture of that size; width and height 0 if they do not overlap.
Rectangle Clipped(const Rectangle& area, int32_t width, int32_t height);

// A copy of part of an image, which must be within it; depth and colors stay. Statuses as
// NewPackedImage.
Status CutImage(const PackedImage& image, const Rectangle& area, PackedImage& cut);

// Cuts a picture and its alpha plane down to an area, of which what is outside is left out. `width`
// and `height` follow. EmptyImage when nothing of the area is on the picture; a failure leaves the
// picture unchanged.
Status CutPicture(PictureRecord& picture, const Rectangle& area);

}  // namespace fotomill
