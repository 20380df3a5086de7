#include "catalog/thumbnails/thumbnail_record.h"

#include <algorithm>
#include <cstring>

#include "picture/picture_record.h"
#include "processing/color/blend.h"
#include "processing/geometry/scale.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// Blends a pixel with the background.
using Mix = uint8_t (*)(uint8_t background, uint8_t pixel, uint8_t alpha);

uint8_t MixEachRoundedDown(uint8_t background, uint8_t pixel, uint8_t alpha) {
  return static_cast<uint8_t>(background * (255 - alpha) / 255 + pixel * alpha / 255);
}

struct ScaledPicture {
  PackedImage image, alpha;
};

// Scales both edges by the percentage at which the longer one fits.
Status ScaleQuickly(const PictureRecord& picture, ScaledPicture& scaled) {
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  const int32_t percentage =
      std::min(100 * kSmallThumbnailSide / width, 100 * kSmallThumbnailSide / height);
  const Size size = SizeAtPercentage(width, height, percentage);
  RETURN_IF_BAD(ScaleNearest(picture.image, size, scaled.image));
  return picture.alpha.Empty() ? Status::Ok : ScaleNearest(picture.alpha, size, scaled.alpha);
}

Status ScaleToFit(const PictureRecord& picture, ScaledPicture& scaled) {
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  const bool reduced = picture.width > width || picture.height > height;
  const Size size = reduced ? FitSize(picture.width, picture.height, kSmallThumbnailSide)
                            : FitSize(width, height, kSmallThumbnailSide);
  return ScaleFiltered(picture.image, picture.alpha, ReachOf(picture), size, ScaleFilter::Lanczos,
                       scaled.image, scaled.alpha);
}

template <typename Record>
Status PlaceInSquare(const ScaledPicture& scaled, Color background, Mix mix, Record& record) {
  const uint8_t matte[] = {static_cast<uint8_t>(background >> 16),
                           static_cast<uint8_t>(background >> 8), static_cast<uint8_t>(background)};
  Record made;
  made.Sign();
  made.Fill(background);

  BgrRows rows;
  RETURN_IF_BAD(rows.Open(scaled.image));
  const int32_t width = std::min(scaled.image.Width(), Record::kSide);
  const int32_t height = std::min(scaled.image.Height(), Record::kSide);
  const auto left = static_cast<size_t>((Record::kSide - width) / 2) * 3;
  const int32_t bottom = (Record::kSide - height) / 2;
  for (int32_t r = 0; r < height; ++r) {
    const int32_t y = scaled.image.Height() - 1 - r;
    const uint8_t* const from = rows.Row(y);
    uint8_t* const to = made.StoredRow(bottom + r).data() + left;
    const auto count = static_cast<size_t>(width) * 3;
    if (scaled.alpha.Empty()) {
      std::memcpy(to, from, count);
      continue;
    }
    const uint8_t* const alpha = scaled.alpha.Row(y).data();
    for (size_t i = 0; i < count; ++i) to[i] = mix(matte[i % 3], from[i], alpha[i / 3]);
  }
  record = made;
  return Status::Ok;
}

template <typename Record>
Status ToBitmap(const Record& record, PackedImage& bitmap) {
  RETURN_IF_BAD(NewPackedImage(Record::kSide, Record::kSide, nullptr, 24, bitmap));
  for (int32_t r = 0; r < Record::kSide; ++r)
    std::ranges::copy(record.StoredRow(r), bitmap.StoredRow(r).begin());
  return Status::Ok;
}

}  // namespace

const Palette& ThumbnailPalette() {
  static const Palette palette = [] {
    constexpr uint8_t eight[] = {0, 36, 73, 109, 146, 182, 219, 255}, four[] = {0, 85, 170, 255};
    Palette made{};
    for (size_t i = 0; i < 256; ++i) {
      made[3 * i] = eight[i >> 5];
      made[3 * i + 1] = eight[i >> 2 & 7];
      made[3 * i + 2] = four[i & 3];
    }
    return made;
  }();
  return palette;
}

void ExpandOldRecord(ThumbnailRecord& record) {
  const Palette& palette = ThumbnailPalette();
  uint8_t* const pixels = record.bytes.data() + kThumbnailHeaderSize;
  // Backward, as each pixel overwrites later indices.
  for (size_t i = kSmallThumbnailSide * kSmallThumbnailSide; i-- > 0;) {
    const uint8_t* const color = &palette[size_t{3} * pixels[i]];
    pixels[3 * i] = color[2];
    pixels[3 * i + 1] = color[1];
    pixels[3 * i + 2] = color[0];
  }
}

bool MakeThumbnailRecord(ThumbnailRecord& record, const PictureRecord& picture,
                         const ThumbnailOptions& options) {
  ScaledPicture scaled;
  if (picture.image.Empty()) return false;
  const Status status = options.quick ? ScaleQuickly(picture, scaled) : ScaleToFit(picture, scaled);
  return status == Status::Ok && PlaceInSquare(scaled, options.matte, Blend, record) == Status::Ok;
}

bool MakeBlendedThumbnailRecord(ThumbnailRecord& record, const PictureRecord& picture,
                                Color background) {
  ScaledPicture scaled;
  return !picture.image.Empty() && ScaleQuickly(picture, scaled) == Status::Ok &&
         PlaceInSquare(scaled, background, MixEachRoundedDown, record) == Status::Ok;
}

bool MakeLargeThumbnailRecord(LargeThumbnailRecord& record, const PictureRecord& picture,
                              Color matte) {
  if (picture.image.Empty()) return false;
  Size size{picture.image.Width(), picture.image.Height()};
  if (std::max(size.width, size.height) > kLargeThumbnailSide)
    size = FitSize(size.width, size.height, kLargeThumbnailSide);
  ScaledPicture scaled;
  return ScaleFiltered(picture.image, picture.alpha, size, ScaleFilter::Lanczos, scaled.image,
                       scaled.alpha) == Status::Ok &&
         PlaceInSquare(scaled, matte, Blend, record) == Status::Ok;
}

Status ThumbnailRecordToBitmap(const ThumbnailRecord& record, PackedImage& bitmap) {
  return ToBitmap(record, bitmap);
}
Status ThumbnailRecordToBitmap(const LargeThumbnailRecord& record, PackedImage& bitmap) {
  return ToBitmap(record, bitmap);
}

}  // namespace fotomill
