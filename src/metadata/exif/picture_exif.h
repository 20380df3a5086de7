#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/geometry/orient.h"

namespace fotomill {

// How a picture has to be turned to be upright, as its EXIF block says.
Orientation OrientationOf(const PictureRecord& picture);

// Turns a picture, and what its EXIF block and XMP packet say of it: the orientation becomes 1, and
// a thumbnail of the old position is dropped. MemoryAllocationError leaves it unchanged.
Status TurnPicture(PictureRecord& picture, Orientation turn);
// The same as its EXIF block asks; one that is upright already, or has no block, stays as it is.
Status TurnUpright(PictureRecord& picture);

// Makes the EXIF block tell the truth about the picture as it is now, before it is written: its
// sizes are the picture's.
void RefreshExif(PictureRecord& picture);

}  // namespace fotomill
