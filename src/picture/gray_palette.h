#pragma once

#include <cstdint>

#include "picture/palette.h"

namespace fotomill {

// Even steps from black to white for `bits` bits, 1 to 8; the remaining entries are 0.
Palette GrayLevels(int32_t bits);

// Whether the first `colors` entries are gray, in any order; false if `colors` is 0.
bool HasOnlyGrays(const Palette& palette, int32_t colors);

}  // namespace fotomill
