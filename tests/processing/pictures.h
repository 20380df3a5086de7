#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <initializer_list>
#include <vector>

#include "picture/picture_record.h"

namespace fotomill::test {

// A 24-bit picture whose pixel at column x, row y from the top is colorAt(x, y), 0x00RRGGBB.
inline PicturePointer MakePicture(int32_t width, int32_t height,
                                  const std::function<uint32_t(int32_t, int32_t)>& colorAt) {
  PicturePointer picture = NewPictureRecord();
  EXPECT_EQ(NewPackedImage(width, height, nullptr, 24, picture->image), Status::Ok);
  picture->width = width;
  picture->height = height;
  picture->bitsPerPixel = 24;
  for (int32_t y = 0; y < height; ++y) {
    uint8_t* pixel = picture->image.Row(y).data();
    for (int32_t x = 0; x < width; ++x, pixel += 3) {
      for (int c = 0; c < 3; ++c) pixel[c] = static_cast<uint8_t>(colorAt(x, y) >> (8 * c));
    }
  }
  return picture;
}

inline void AddAlpha(PictureRecord& picture,
                     const std::function<int32_t(int32_t, int32_t)>& alphaAt) {
  EXPECT_EQ(NewAlphaPlane(picture.image.Width(), picture.image.Height(), picture.alpha), Status::Ok);
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    for (int32_t x = 0; x < picture.image.Width(); ++x) {
      picture.alpha.Row(y)[static_cast<size_t>(x)] = static_cast<uint8_t>(alphaAt(x, y));
    }
  }
  picture.alphaFlags |= kHasAlpha;
}

// The color of a pixel, 0x00RRGGBB, at any depth, through the picture's palette.
inline uint32_t ColorAt(const PictureRecord& picture, int32_t x, int32_t y) {
  const int32_t value = picture.image.PixelAt(x, y);
  if (picture.image.Bits() == 24) return static_cast<uint32_t>(value);
  const uint8_t* color = picture.palette.data() + 3 * value;
  return static_cast<uint32_t>(color[0] << 16 | color[1] << 8 | color[2]);
}

// All pixels, row by row from the top.
inline std::vector<uint32_t> Colors(const PictureRecord& picture) {
  std::vector<uint32_t> colors;
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    for (int32_t x = 0; x < picture.image.Width(); ++x) colors.push_back(ColorAt(picture, x, y));
  }
  return colors;
}

// A pseudorandom number that is the same in every run.
inline uint32_t Scatter(int32_t x, int32_t y) {
  uint32_t value = static_cast<uint32_t>(x) * 0x9e3779b1u ^ static_cast<uint32_t>(y) * 0x85ebca77u;
  value = (value ^ value >> 15) * 0x2c1b3c6du;
  value = (value ^ value >> 12) * 0x297a2d39u;
  return value ^ value >> 15;
}

}  // namespace fotomill::test
