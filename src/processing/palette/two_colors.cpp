#include "processing/palette/two_colors.h"

#include <algorithm>

namespace fotomill {

namespace {

int32_t Luma(const uint8_t* color) { return 299 * color[0] + 587 * color[1] + 114 * color[2]; }

}  // namespace

bool IsDarkFirst(const Palette& palette) { return Luma(&palette[0]) <= Luma(&palette[3]); }

Palette BlackAndWhite(bool blackFirst) {
  Palette palette;
  MakeDefaultPalette(&palette, nullptr, kBlackAndWhitePalette);
  if (!blackFirst) std::swap_ranges(palette.begin(), palette.begin() + 3, palette.begin() + 3);
  return palette;
}

}  // namespace fotomill
