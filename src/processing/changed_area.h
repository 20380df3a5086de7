#pragma once

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// The bounding box of all pixels that differ between two canvases of the same size; pixels that are
// transparent in both are equal. One pixel at the top left if nothing differs.
Rectangle ChangedArea(const Canvas& before, const Canvas& after);

// Makes the frame in `picture` what `screen` shows, and leaves in `picture`, with an alpha plane,
// the part of it that has to be stored: `area`, whose left and top are multiples of `grid` pixels.
// All of the first frame, for which `screen` is empty. UnsuitableImage for a frame of another size
// than the one before, MemoryAllocationError.
Status CutToChange(PictureRecord& picture, int32_t grid, Canvas& screen, Rectangle& area);

}  // namespace fotomill
