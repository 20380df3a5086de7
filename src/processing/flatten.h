#pragma once

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// Composites a picture with an alpha plane onto its background color (the record's own if set, else
// its `defaultColour`) and frees the plane: 24 bits in place, per channel (background x (255 - a) +
// pixel x a) / 255, rounded to nearest. Palette pictures are blended likewise and get the smallest
// palette for the blended colors, or 24 bits if there are more than 256. A picture without a plane
// is unchanged. MemoryAllocationError, for palette pictures only, leaves it unchanged or, with its
// plane, at 24 bits.
Status FlattenAlpha(PictureRecord& picture);

// Whether all values of an alpha plane are 255.
bool IsOpaque(const PackedImage& alpha);

}  // namespace fotomill
