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

// Pixels as windows draw them: red, green, blue, top row first, no padding. Made off the window's
// thread.
struct RgbImage {
  int32_t width = 0, height = 0;
  std::vector<uint8_t> bytes;

  // Row y, from the top, holds 3 x width bytes.
  bool Empty() const { return bytes.empty(); }
  uint8_t* Row(int32_t y) {
    return bytes.data() + static_cast<size_t>(y) * static_cast<size_t>(width) * 3;
  }
  const uint8_t* Row(int32_t y) const {
    return bytes.data() + static_cast<size_t>(y) * static_cast<size_t>(width) * 3;
  }
};

// An image of `width` by `height` in one color, 0x00BBGGRR.
RgbImage FilledImage(int32_t width, int32_t height, Color color);

// The pixels of a packed image of any depth. Statuses as NewPackedImage.
Status ToRgb(const PackedImage& image, RgbImage& rgb);

// The same with an alpha plane, on a background of one color, 0x00BBGGRR.
Status ToRgb(const PackedImage& image, const PackedImage& alpha, Color background, RgbImage& rgb);

// And back: a packed image of 24 bits. Statuses as NewPackedImage.
Status ToPacked(const RgbImage& rgb, PackedImage& image);

// Turns a picture upright by its EXIF orientation, if ExifAdjustOrientation asks for it, composites
// its alpha plane onto `background` (0x00BBGGRR) and brings it to 24 bits: what a window can show.
// Statuses of those steps.
Status PrepareForDisplay(PictureRecord& picture, Color background);

// The same without a background: the alpha plane stays, unless the picture is opaque after all.
Status PrepareWithAlpha(PictureRecord& picture);

}  // namespace fotomill::desktop
