#pragma once

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// Composites a 24-bit picture that has an alpha plane onto its background colour (the record's own when it says so, else
// its `defaultColour`), in place, and frees the plane. Per channel (background x (255 - a) + pixel x a) / 255, rounded to
// nearest. A picture without a plane is left as it is. Always Ok.
Status FlattenAlpha(PictureRecord& picture);

}  // namespace fotomill
