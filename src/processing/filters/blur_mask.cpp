#include "processing/filters/blur_mask.h"

#include <utility>

#include "picture/palette.h"
#include "picture/picture_record.h"
#include "processing/filters/gaussian.h"

namespace fotomill {

Status BlurMask(PackedImage& mask, double sigma, const Work& work) {
  if (sigma < 0.1) return Status::Ok;
  const int32_t width = mask.Width(), height = mask.Height();
  PictureRecord gray;
  gray.palette = GrayRamp();
  gray.width = width;
  gray.height = height;
  gray.bitsPerPixel = mask.Bits();
  gray.image = std::move(mask);
  RETURN_IF_BAD(BlurPicture(gray, sigma, {}, work));
  RETURN_IF_BAD(NewAlphaPlane(width, height, mask, platform::Fill::Unset));
  for (int32_t y = 0; y < height; ++y) {
    const uint8_t* pixel = gray.image.Row(y).data();
    for (int32_t x = 0; x < width; ++x, pixel += 3) mask.Row(y)[static_cast<size_t>(x)] = *pixel;
  }
  return Status::Ok;
}

}  // namespace fotomill
