#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// The part of `area` within a picture of that size; width and height 0 if they do not overlap.
Rectangle Clipped(const Rectangle& area, int32_t width, int32_t height);

// Copies a part of an image, which must be within it; depth and palette are kept.
// Statuses as NewPackedImage.
Status CutImage(const PackedImage& image, const Rectangle& area, PackedImage& cut);

// Crops a picture and its alpha plane to the part of an area
// within it, and sets `width` and `height`. EmptyImage if
// the area is outside; on failure the picture is unchanged.
Status CutPicture(PictureRecord& picture, const Rectangle& area);

}  // namespace fotomill
