#pragma once

#include "core/status.h"
#include "picture/picture_record.h"

namespace fotomill {

// Turns a picture upright as its EXIF block asks, and the block with it: its orientation becomes 1 and a thumbnail of the
// old position is dropped. A picture that is upright already, or has no block, stays as it is. MemoryAllocationError
// leaves it unchanged.
Status TurnUpright(PictureRecord& picture);

// Makes the EXIF block tell the truth about the picture as it is now, before it is written: its sizes are the picture's.
void RefreshExif(PictureRecord& picture);

}  // namespace fotomill
