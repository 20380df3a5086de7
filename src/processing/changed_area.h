#pragma once

#include "picture/animation.h"
#include "picture/rectangle.h"

namespace fotomill {

// The smallest rectangle that holds all pixels in which two canvases of one size differ; pixels
// that are transparent in both do not. One pixel at the top left where nothing differs.
Rectangle ChangedArea(const Canvas& before, const Canvas& after);

}  // namespace fotomill
