#pragma once

#include <cstdint>

#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "processing/geometry/canvas.h"

namespace fotomill {

// Composites colors and pictures over a picture: the Porter-Duff "over" operator, "Compositing
// Digital Images" (1984). Clipped to the picture.

// Paints a color through a mask: an alpha plane with its top left pixel at (left, top). The
// picture is converted to 24 bits; existing alpha increases with the opacity of the paint.
// Statuses as PromotePicture.
Status PaintThroughMask(PictureRecord& picture, const PackedImage& mask, int32_t left, int32_t top,
                        const Backdrop& color);
// As above, on a 24-bit image without alpha.
void PaintThroughMask(PackedImage& image, const PackedImage& mask, int32_t left, int32_t top,
                      const Backdrop& color);

// Paints a rectangle of one color; statuses as PaintThroughMask.
Status PaintRectangle(PictureRecord& picture, const Rectangle& area, const Backdrop& color);

// Composites a 24-bit picture, with its alpha plane if it has one, over another at (left, top). Its
// alpha is scaled by opacity / 255. Statuses as PaintThroughMask.
Status PaintPicture(PictureRecord& picture, const PictureRecord& above, int32_t left, int32_t top,
                    uint8_t opacity);

// Tiles a rectangle with copies of an opaque 24-bit picture, starting at its top left corner.
// Statuses as PaintThroughMask.
Status PaintTiles(PictureRecord& picture, const PictureRecord& tile, const Rectangle& area);

}  // namespace fotomill
