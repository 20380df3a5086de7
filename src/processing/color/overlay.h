#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "processing/geometry/canvas.h"

namespace fotomill {

// Lays colors and pictures over a picture: Porter and Duff's "over", "Compositing Digital Images"
// (1984). What would be outside the picture is left out.

// Paints a color where a mask says: an alpha plane whose top left pixel is at (left, top). The
// picture becomes one of 24 bits; one with alpha becomes as opaque as what is painted. Statuses as
// PromotePicture.
Status PaintThroughMask(PictureRecord& picture, const PackedImage& mask, int32_t left, int32_t top,
                        const Backdrop& color);
// The same on an image of 24 bits that has no alpha.
void PaintThroughMask(PackedImage& image, const PackedImage& mask, int32_t left, int32_t top,
                      const Backdrop& color);

// Paints a rectangle of one color; statuses as PaintThroughMask.
Status PaintRectangle(PictureRecord& picture, const Rectangle& area, const Backdrop& color);

// Lays a picture of 24 bits over another one, with its alpha plane where it has one, at (left,
// top). Its own opacity is that of 255. Statuses as PaintThroughMask.
Status PaintPicture(PictureRecord& picture, const PictureRecord& above, int32_t left, int32_t top,
                    uint8_t opacity);

// Covers a rectangle with copies of an opaque picture of 24 bits, side by side from the rectangle's
// top left corner. Statuses as PaintThroughMask.
Status PaintTiles(PictureRecord& picture, const PictureRecord& tile, const Rectangle& area);

}  // namespace fotomill
