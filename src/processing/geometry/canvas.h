#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// Operations that move whole pixels. All of them keep the depth of a palette picture.

// What is behind a picture.
struct Backdrop {
  uint8_t blue = 255, green = 255, red = 255, alpha = 255;
};

// Puts the picture onto a canvas of `size` with its top left pixel at (x, y), which may be outside;
// what does not fit is cut off. A palette that lacks the color of the backdrop gives it an entry
// that no pixel uses; when there is none, the picture becomes one of 24 bits. A backdrop with alpha
// below 255 brings an alpha plane. Statuses as NewPackedImage; EmptyImage without a picture. On
// failure the picture is whole.
Status PlaceOnCanvas(PictureRecord& picture, Size size, int32_t x, int32_t y,
                     const Backdrop& backdrop);

// Moves the picture right and down; what leaves on one side comes in on the other. Any number of
// pixels. Statuses as PlaceOnCanvas.
Status WrapPicture(PictureRecord& picture, int64_t right, int64_t down);

// The smallest rectangle outside of which each channel of every pixel is within `fuzz` levels of
// the top left pixel's. Pixels that are both transparent are equal. The whole picture when there is
// nothing else in it. MemoryAllocationError.
Status FindContent(const PictureRecord& picture, int32_t fuzz, Rectangle& content);

}  // namespace fotomill
