#pragma once

#include "picture/palette.h"

namespace fotomill {

// Whether the first of a palette's first two colors is the darker one, as in the usual black and
// white. Formats that know only black and white store the darker of two colors as black.
bool IsDarkFirst(const Palette& palette);

// Black and white in that order, or white and black.
Palette BlackAndWhite(bool blackFirst);

}  // namespace fotomill
