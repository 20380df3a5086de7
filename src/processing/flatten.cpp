#include "processing/flatten.h"

#include <algorithm>
#include <cassert>

#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr uint8_t Blend(uint32_t background, uint32_t pixel, uint32_t alpha) {
  return static_cast<uint8_t>((background * (255 - alpha) + pixel * alpha + 127) / 255);
}

void FlattenRow(std::span<uint8_t> row, std::span<const uint8_t> alpha, int32_t width, const uint8_t (&background)[3]) {
  uint8_t* pixel = row.data();
  for (int32_t x = 0; x < width; ++x, pixel += 3) {
    const uint8_t a = alpha[static_cast<size_t>(x)];
    for (int channel = 0; channel < 3; ++channel) pixel[channel] = Blend(background[channel], pixel[channel], a);
  }
}

// Padding is left out: it may hold anything.
bool IsOpaque(const PackedImage& alpha) {
  for (int32_t r = 0; r < alpha.Height(); ++r) {
    const auto row = alpha.StoredRow(r).first(static_cast<size_t>(alpha.Width()));
    if (!std::ranges::all_of(row, [](uint8_t a) { return a == 255; })) return false;
  }
  return true;
}

}  // namespace

Status FlattenAlpha(PictureRecord& picture) {
  if (picture.alpha.Empty() || (picture.alphaFlags & kHasAlpha) == 0) return Status::Ok;
  assert(picture.alpha.Width() == picture.image.Width() && picture.alpha.Height() == picture.image.Height());
  const bool ownBackground = (picture.alphaFlags & kFlattenOnBackground) != 0;
  const Color color = ownBackground ? picture.background : picture.defaultColour;
  const uint8_t background[3] = {static_cast<uint8_t>(color >> 16), static_cast<uint8_t>(color >> 8),
                                 static_cast<uint8_t>(color)};  // blue, green, red
  if (!IsOpaque(picture.alpha)) {
    RETURN_IF_BAD(PromotePicture(picture));
    for (int32_t r = 0; r < picture.image.Height(); ++r) {
      FlattenRow(picture.image.StoredRow(r), picture.alpha.StoredRow(r), picture.image.Width(), background);
    }
  }
  picture.alpha.Free();
  picture.alphaFlags &= static_cast<uint8_t>(~kHasAlpha);
  return Status::Ok;
}

}  // namespace fotomill
