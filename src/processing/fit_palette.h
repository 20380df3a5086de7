#pragma once

#include <cstdint>
#include <vector>

#include "picture/palette.h"
#include "processing/color_histogram.h"

namespace fotomill {

// Finds at most `colors` (1 to 256) colours that stand for the bins with the least squared error: groups are cut in two
// across their longest axis, the worst group first (Orchard and Bouman 1991), then all are moved to the middle of the
// bins nearest to them, over and over (Lloyd 1982). Writes them to `palette` in order of brightness, black behind the
// last, and returns their number. Reorders `bins`.
int32_t FitPalette(std::vector<ColorBin>& bins, int32_t colors, Palette& palette);

}  // namespace fotomill
