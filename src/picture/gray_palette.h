#pragma once

#include <cstdint>

#include "picture/palette.h"

namespace fotomill {

// Even steps from black to white for a depth of `bits`, 1 to 8; entries behind them are 0.
Palette GrayLevels(int32_t bits);

// Whether the first `colors` entries are gray, in whatever order; not so without any.
bool HasOnlyGrays(const Palette& palette, int32_t colors);

}  // namespace fotomill
