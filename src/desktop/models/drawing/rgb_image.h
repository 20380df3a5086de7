#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "core/status.h"
#include "picture/palette.h"

namespace fotomill {
class PackedImage;
struct PictureRecord;
}

namespace fotomill::desktop {

// Pixels for windows: red, green, blue, top row
// first, no padding. Can be created on any thread.
struct RgbImage {
  int32_t width = 0, height = 0;
  std::vector<uint8_t> bytes;

  // Row y from the top has 3 x width bytes.
  bool Empty() const { return bytes.empty(); }
  uint8_t* Row(int32_t y) {
    return bytes.data() + static_cast<size_t>(y) * static_cast<size_t>(width) * 3;
  }
  const uint8_t* Row(int32_t y) const {
    return bytes.data() + static_cast<size_t>(y) * static_cast<size_t>(width) * 3;
  }
};

// An image of one color, 0x00BBGGRR.
RgbImage FilledImage(int32_t width, int32_t height, Color color);

// Converts a packed image of any depth. Statuses of NewPackedImage.
Status ToRgb(const PackedImage& image, RgbImage& rgb);

// The same with an alpha plane, on a background color, 0x00BBGGRR.
Status ToRgb(const PackedImage& image, const PackedImage& alpha, Color background, RgbImage& rgb);

// Converts to a packed image of 24 bits. Statuses of NewPackedImage.
Status ToPacked(const RgbImage& rgb, PackedImage& image);

// Prepares a picture for display: turns it upright by EXIF orientation, depending on
// ExifAdjustOrientation, composites its alpha plane onto `background` (0x00BBGGRR) and converts it
// to 24 bits. Statuses of those steps.
Status PrepareForDisplay(PictureRecord& picture, Color background);

// The same without background: keeps the alpha plane, unless it is opaque.
Status PrepareWithAlpha(PictureRecord& picture);

}  // namespace fotomill::desktop
