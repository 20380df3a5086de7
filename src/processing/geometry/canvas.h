#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "processing/geometry/scale.h"

namespace fotomill {

// Operations that move whole pixels. They keep the depth of palette pictures.

// The color behind a picture.
struct Backdrop {
  uint8_t blue = 255, green = 255, red = 255, alpha = 255;
};

// Places the picture on a canvas of `size` with its top left pixel at (x, y),
// which may be outside; clipped to the canvas. If the palette lacks the backdrop's
// color, an unused entry is changed; if there is none, the picture becomes 24-bit.
// A backdrop with alpha below 255 adds an alpha plane. Statuses as NewPackedImage;
// EmptyImage without a picture. On failure the picture is still valid.
Status PlaceOnCanvas(PictureRecord& picture, Size size, int32_t x, int32_t y,
                     const Backdrop& backdrop);

// Shifts the picture right and down by any number of pixels, wrapping around at the edges. Statuses
// as PlaceOnCanvas.
Status WrapPicture(PictureRecord& picture, int64_t right, int64_t down);

// The bounding box of all pixels with a channel that differs by more than `fuzz` levels from
// the top left pixel. Transparent pixels are equal to each other. The whole picture if there
// are none. MemoryAllocationError.
Status FindContent(const PictureRecord& picture, int32_t fuzz, Rectangle& content);

}  // namespace fotomill
