#pragma once

#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"

namespace fotomill {

// The bounding box of all pixels that differ between two canvases of the same size; pixels that are
// transparent in both are equal. One pixel at the top left if nothing differs.
Rectangle ChangedArea(const Canvas& before, const Canvas& after);

// Updates `screen` to the frame in `picture`, and reduces `picture`, with an alpha plane, to the
// part that has to be stored: `area`, whose left and top are multiples of `grid` pixels; all of the
// first frame, for which `screen` is empty. UnsuitableImage if the frame differs in size from the
// previous one, MemoryAllocationError.
Status CutToChange(PictureRecord& picture, int32_t grid, Canvas& screen, Rectangle& area);

}  // namespace fotomill
