#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "picture/packed_image.h"
#include "picture/palette.h"

namespace fotomill {

// Whether the first of a palette's first two colors is the darker one, as in the usual black and
// white. Formats that know only black and white store the darker of two colors as black.
bool IsDarkFirst(const Palette& palette);

// Black and white in that order, or white and black.
Palette BlackAndWhite(bool blackFirst);

// The rows of a picture of two colors for formats that know only black and white: (width + 7) / 8
// bytes each, the leftmost pixel in the highest bit. The bits behind the last pixel may be
// anything.
class BlackAndWhiteRows {
 public:
  // `blackBit`, 0 or 1, becomes the bit of the darker color. The image must outlive the rows.
  BlackAndWhiteRows(const PackedImage& image, const Palette& palette, int blackBit);

  std::span<uint8_t> Row(int32_t y);  // from the top; valid until the next call

 private:
  const PackedImage& image_;
  const uint8_t invert_;  // 255 to turn bits around, else 0
  std::vector<uint8_t> row_;
};

}  // namespace fotomill
