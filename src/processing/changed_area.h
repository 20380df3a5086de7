#pragma once

#include "picture/animation.h"
#include "picture/rectangle.h"

namespace fotomill {

// The bounding box of all pixels that differ between two canvases of the same size; pixels that are
// transparent in both are equal. One pixel at the top left if nothing differs.
Rectangle ChangedArea(const Canvas& before, const Canvas& after);

}  // namespace fotomill
