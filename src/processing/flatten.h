#pragma once

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// Composites a picture whose alpha plane is marked as present (kHasAlpha) onto its background colour (the record's own
// when it says so, else its `defaultColour`), in place, and frees the plane. Per channel (background x (255 - a) +
// pixel x a) / 255, rounded to nearest. A palette picture becomes one of 24 bits first, unless it is opaque throughout.
// A picture without such a plane is left as it is. MemoryAllocationError leaves the picture unchanged.
Status FlattenAlpha(PictureRecord& picture);

}  // namespace fotomill
