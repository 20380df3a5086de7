#include "desktop/models/drawing/rgb_image.h"

#include <algorithm>
#include <cstring>
#include <new>

#include "metadata/exif/picture_exif.h"
#include "picture/picture_record.h"
#include "processing/color/blend.h"
#include "processing/flatten.h"
#include "processing/pixel_rows.h"
#include "processing/promote.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

bool Reserve(RgbImage& image, int32_t width, int32_t height) {
  try {
    image.bytes.resize(static_cast<size_t>(width) * static_cast<size_t>(height) * 3);
  } catch (const std::bad_alloc&) {
    image = {};
    return false;
  }
  image.width = width;
  image.height = height;
  return true;
}

}  // namespace

RgbImage FilledImage(int32_t width, int32_t height, Color color) {
  RgbImage image;
  if (!Reserve(image, width, height)) return image;
  const size_t row = 3 * static_cast<size_t>(width);
  for (size_t i = 0; i < std::min(row, image.bytes.size()); ++i)
    image.bytes[i] = static_cast<uint8_t>(color >> (8 * (i % 3)));
  for (int32_t y = 1; y < height; ++y) std::memcpy(image.Row(y), image.Row(0), row);
  return image;
}

Status ToRgb(const PackedImage& image, RgbImage& rgb) {
  BgrRows rows;
  RETURN_IF_BAD(rows.Open(image));
  if (!Reserve(rgb, image.Width(), image.Height())) return Status::MemoryAllocationError;
  for (int32_t y = 0; y < rgb.height; ++y)
    SwapColors(rows.Row(y), static_cast<size_t>(rgb.width), rgb.Row(y));
  return Status::Ok;
}

Status ToRgb(const PackedImage& image, const PackedImage& alpha, Color background, RgbImage& rgb) {
  RETURN_IF_BAD(ToRgb(image, rgb));
  for (int32_t y = 0; y < rgb.height && !alpha.Empty(); ++y) {
    uint8_t* pixel = rgb.Row(y);
    for (const uint8_t a : alpha.Row(y).first(static_cast<size_t>(rgb.width))) {
      for (int shift = 0; shift < 24; shift += 8, ++pixel)
        *pixel = Blend(static_cast<uint8_t>(background >> shift), *pixel, a);
    }
  }
  return Status::Ok;
}

Status ToPacked(const RgbImage& rgb, PackedImage& image) {
  RETURN_IF_BAD(NewPackedImage(rgb.width, rgb.height, nullptr, 24, image));
  for (int32_t y = 0; y < rgb.height; ++y)
    SwapColors(rgb.Row(y), static_cast<size_t>(rgb.width), image.Row(y).data());
  return Status::Ok;
}

Status PrepareForDisplay(PictureRecord& picture, Color background) {
  if (picture.image.Empty()) return Status::EmptyImage;
  if (settings.ExifAdjustOrientation != 0) RETURN_IF_BAD(TurnUpright(picture));
  picture.defaultColour = background;
  picture.alphaFlags &= static_cast<uint8_t>(~kFlattenOnBackground);
  RETURN_IF_BAD(FlattenAlpha(picture));
  return PromotePicture(picture);
}

Status PrepareWithAlpha(PictureRecord& picture) {
  if (picture.image.Empty()) return Status::EmptyImage;
  if (settings.ExifAdjustOrientation != 0) RETURN_IF_BAD(TurnUpright(picture));
  if (!picture.alpha.Empty() && IsOpaque(picture.alpha)) picture.alpha.Free();
  return PromotePicture(picture);
}

}  // namespace fotomill::desktop
