#pragma once

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// Composites a picture that has an alpha plane onto its background color (the record's own when it
// says so, else its `defaultColour`) and frees the plane: 24 bits in place, per channel (background
// x (255 - a) + pixel x a) / 255, rounded to nearest. A palette picture is blended the same way and
// gets the shallowest palette that holds the blended colors, or 24 bits when there are more than
// 256. A picture without a plane is left as it is. MemoryAllocationError, for palette pictures
// only, leaves it unchanged or, still with its plane, at 24 bits.
Status FlattenAlpha(PictureRecord& picture);

// Whether an alpha plane has nothing but 255.
bool IsOpaque(const PackedImage& alpha);

}  // namespace fotomill
