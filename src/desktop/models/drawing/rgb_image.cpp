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

bool RowIs(const RgbImage& image, int32_t y, const uint8_t* color) {
  const uint8_t* pixel = image.Row(y);
  for (int32_t x = 0; x < image.width; ++x, pixel += 3) {
    if (std::memcmp(pixel, color, 3) != 0) return false;
  }
  return true;
}

bool ColumnIs(const RgbImage& image, int32_t x, const uint8_t* color) {
  for (int32_t y = 0; y < image.height; ++y) {
    if (std::memcmp(image.Row(y) + 3 * x, color, 3) != 0) return false;
  }
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

RgbImage WithoutMatte(const RgbImage& image, Color matte) {
  const uint8_t color[3] = {static_cast<uint8_t>(matte), static_cast<uint8_t>(matte >> 8),
                            static_cast<uint8_t>(matte >> 16)};
  int32_t top = 0, left = 0;
  // The two sides of a margin differ by one pixel at most, since the picture is in the middle.
  while (2 * (top + 1) < image.height && RowIs(image, top, color) &&
         RowIs(image, image.height - 1 - top, color))
    ++top;
  while (2 * (left + 1) < image.width && ColumnIs(image, left, color) &&
         ColumnIs(image, image.width - 1 - left, color))
    ++left;
  RgbImage cut;
  if (!Reserve(cut, image.width - 2 * left, image.height - 2 * top)) return cut;
  for (int32_t y = 0; y < cut.height; ++y) {
    std::memcpy(cut.Row(y), image.Row(y + top) + 3 * left, static_cast<size_t>(cut.width) * 3);
  }
  return cut;
}

}  // namespace fotomill::desktop
