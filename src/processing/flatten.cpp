#include "processing/flatten.h"

#include <algorithm>
#include <cstring>

#include "processing/color/blend.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kAtOnce = 64;  // pixels

// The background, repeated for a block of pixels.
struct Background {
  uint8_t bgr[3 * kAtOnce];
  explicit Background(Color color) {
    for (int i = 0; i < 3 * kAtOnce; ++i) bgr[i] = static_cast<uint8_t>(color >> (16 - i % 3 * 8));
  }
};

void BlendBlock(uint8_t* bgr, const uint8_t* alpha, int32_t pixels, const Background& background) {
  if (std::all_of(alpha, alpha + pixels, [](uint8_t a) { return a == 255; })) return;
  // each alpha three times, so that the inner loop treats all bytes alike
  uint8_t spread[3 * kAtOnce + 1];
  for (int32_t i = 0; i < pixels; ++i) {
    const uint32_t four = alpha[i] * 0x01010101u;
    std::memcpy(spread + 3 * i, &four, 4);
  }
  for (int32_t i = 0; i < 3 * pixels; ++i) bgr[i] = Blend(background.bgr[i], bgr[i], spread[i]);
}

}  // namespace

bool IsOpaque(const PackedImage& alpha) {
  for (int32_t r = 0; r < alpha.Height(); ++r) {
    const auto row = alpha.StoredRow(r).first(static_cast<size_t>(alpha.Width()));
    if (!std::all_of(row.begin(), row.end(), [](uint8_t a) { return a == 255; })) return false;
  }
  return true;
}

Status FlattenAlpha(PictureRecord& picture) {
  if (picture.alpha.Empty()) return Status::Ok;
  const bool fromPalette = picture.image.Bits() < 24 && !IsOpaque(picture.alpha);
  if (fromPalette) RETURN_IF_BAD(PromotePicture(picture));
  if (picture.image.Bits() == 24) {
    const bool ownBackground = (picture.alphaFlags & kFlattenOnBackground) != 0;
    const Background background(ownBackground ? picture.background : picture.defaultColour);
    const int32_t width = picture.image.Width();
    for (int32_t r = 0; r < picture.image.Height(); ++r) {
      uint8_t* bgr = picture.image.StoredRow(r).data();
      const uint8_t* alpha = picture.alpha.StoredRow(r).data();
      for (int32_t x = 0; x < width; x += kAtOnce) {
        BlendBlock(bgr + 3 * static_cast<size_t>(x), alpha + x, std::min(kAtOnce, width - x),
                   background);
      }
    }
  }
  picture.alpha.Free();
  picture.alphaFlags &= static_cast<uint8_t>(~kHasAlpha);
  bool packed = false;
  return fromPalette ? PackFewColors(picture, 8, packed) : Status::Ok;
}

}  // namespace fotomill
