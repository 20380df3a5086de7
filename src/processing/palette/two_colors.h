#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "picture/packed_image.h"
#include "picture/palette.h"

namespace fotomill {

// Whether the first of a palette's first two colors is the darker one, as in the usual black and
// white. Bilevel formats store the darker of two colors as black.
bool IsDarkFirst(const Palette& palette);

// Black and white, or white and black.
Palette BlackAndWhite(bool blackFirst);

// Rows of a two-color picture for bilevel formats:
// (width + 7) / 8 bytes each, the leftmost pixel
// in the highest bit. Padding bits are undefined.
class BlackAndWhiteRows {
 public:
  // `blackBit`, 0 or 1, is the bit value for the darker color. The image must outlive the rows.
  BlackAndWhiteRows(const PackedImage& image, const Palette& palette, int blackBit);

  std::span<uint8_t> Row(int32_t y);  // from the top; valid until the next call

 private:
  const PackedImage& image_;
  const uint8_t invert_;  // 255 to invert the bits, else 0
  std::vector<uint8_t> row_;
};

}  // namespace fotomill
