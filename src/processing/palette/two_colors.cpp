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

BlackAndWhiteRows::BlackAndWhiteRows(const PackedImage& image, const Palette& palette, int blackBit)
    : image_(image),
      invert_(IsDarkFirst(palette) == (blackBit == 0) ? 0 : 0xff),
      row_((static_cast<size_t>(image.Width()) + 7) / 8) {}

std::span<uint8_t> BlackAndWhiteRows::Row(int32_t y) {
  const auto row = image_.Row(y).first(row_.size());
  std::ranges::transform(row, row_.begin(),
                         [this](uint8_t byte) { return static_cast<uint8_t>(byte ^ invert_); });
  return row_;
}

}  // namespace fotomill
