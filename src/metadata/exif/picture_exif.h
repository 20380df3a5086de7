#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/geometry/orient.h"

namespace fotomill {

// How to turn a picture upright, from its EXIF block.
Orientation OrientationOf(const PictureRecord& picture);

// Turns a picture and updates its EXIF block and XMP packet: the orientation becomes 1, and the old
// thumbnail is dropped. MemoryAllocationError leaves it unchanged.
Status TurnPicture(PictureRecord& picture, Orientation turn);
// Turns a picture by its EXIF orientation; no change if it is upright or has no block.
Status TurnUpright(PictureRecord& picture);

// Updates the EXIF block before the picture
// is written: sets the picture size.
void RefreshExif(PictureRecord& picture);

}  // namespace fotomill
