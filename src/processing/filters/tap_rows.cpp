#include "processing/filters/tap_rows.h"

#include <algorithm>

#include "processing/promote.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 32;

}  // namespace

Status TapRows::Open(const PictureRecord& picture, int32_t reach) {
  width_ = picture.image.Width();
  hasAlpha_ = !picture.alpha.Empty();
  RETURN_IF_BAD(colors_.Open(picture.image, reach));
  if (!hasAlpha_) return Status::Ok;
  mixed_.resize(3 * static_cast<size_t>(width_));
  return alpha_.Open(picture.alpha, reach);
}

const uint8_t* TapRows::At(int32_t dx, int32_t dy) {
  const uint8_t* neighbors = colors_.Row(y_ + dy) + static_cast<std::ptrdiff_t>(3) * dx;
  if (!hasAlpha_) return neighbors;
  const uint8_t *own = colors_.Row(y_), *alpha = alpha_.Row(y_ + dy) + dx;
  for (size_t x = 0, i = 0; x < static_cast<size_t>(width_); ++x) {
    const int32_t a = alpha[x];
    for (int c = 0; c < 3; ++c, ++i)
      mixed_[i] = static_cast<uint8_t>((own[i] * (255 - a) + neighbors[i] * a + 127) / 255);
  }
  return mixed_.data();
}

Status FilterRows(PictureRecord& picture, int32_t reach, const Work& work,
                  const std::function<void(TapRows& taps, uint8_t* out)>& row) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  PackedImage image;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, image));
  const auto band = [&](int32_t first, int32_t end) {
    TapRows taps;
    RETURN_IF_BAD(taps.Open(picture, reach));
    for (int32_t y = first; y < end; ++y) {
      taps.MoveTo(y);
      row(taps, image.Row(y).data());
    }
    return Status::Ok;
  };
  RETURN_IF_BAD(ForBands(height, std::max(kLeastRows, 2 * reach), work, band));
  picture.image = std::move(image);
  return Status::Ok;
}

}  // namespace fotomill
