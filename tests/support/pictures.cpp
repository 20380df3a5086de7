#include "support/pictures.h"

#include <algorithm>

namespace fotomill::test {

PicturePointer MakePicture(int32_t width, int32_t height, int32_t bitsPerPixel,
                           const std::vector<std::vector<uint8_t>>& rows) {
  PicturePointer picture = NewPictureRecord();
  picture->width = width;
  picture->height = height;
  picture->bitsPerPixel = bitsPerPixel;
  picture->palette = GrayRamp();
  if (bitsPerPixel == 1) MakeDefaultPalette(&picture->palette, nullptr, kBlackAndWhitePalette);
  if (NewPackedImage(width, height, &picture->palette, bitsPerPixel, picture->image) != Status::Ok)
    return nullptr;
  for (size_t y = 0; y < rows.size(); ++y) {
    const auto row = picture->image.Row(static_cast<int32_t>(y));
    std::copy_n(rows[y].begin(), std::min(rows[y].size(), row.size()), row.begin());
  }
  return picture;
}

std::vector<uint8_t> RowOf(const PackedImage& image, int32_t y) {
  const auto row = image.Row(y).first(
      (static_cast<size_t>(image.Width()) * static_cast<size_t>(image.Bits()) + 7) / 8);
  return {row.begin(), row.end()};
}

std::vector<uint8_t> RowsOf(const PackedImage& image) {
  std::vector<uint8_t> bytes;
  for (int32_t y = 0; y < image.Height(); ++y) {
    const auto row = RowOf(image, y);
    bytes.insert(bytes.end(), row.begin(), row.end());
  }
  return bytes;
}

std::vector<uint8_t> RandomBytes(size_t count, uint32_t seed) {
  std::vector<uint8_t> bytes(count);
  for (uint8_t& byte : bytes) {
    seed = seed * 1664525 + 1013904223;
    byte = static_cast<uint8_t>(seed >> 24);
  }
  return bytes;
}

}  // namespace fotomill::test
