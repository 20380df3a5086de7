#include "processing/promote.h"

#include "processing/pictures.h"

namespace fotomill {
namespace {

using test::Colors;
using test::MakePicture;

// `count` colors, all different, in a picture of 37 x 23 pixels.
PicturePointer PictureOfColors(uint32_t count) {
  return MakePicture(37, 23, [count](int32_t x, int32_t y) {
    const uint32_t i = static_cast<uint32_t>(y * 37 + x) < count ? static_cast<uint32_t>(y * 37 + x)
                                                                 : test::Scatter(x, y) % count;
    return i * 0x010307u & 0xffffff;
  });
}

TEST(Promote, FewColorsRoundTripExactly) {
  struct Row {
    const char* name;
    uint32_t colors;
    int32_t maxBits;
    int32_t bits;
  };
  const Row rows[] = {
      {"one color", 1, 8, 1},
      {"two colors", 2, 8, 1},
      {"three colors", 3, 8, 4},
      {"sixteen colors", 16, 8, 4},
      {"seventeen colors", 17, 8, 8},
      {"256 colors", 256, 8, 8},
      {"257 colors stay", 257, 8, 24},
      {"sixteen where 4 bits are allowed", 16, 4, 4},
      {"seventeen where 4 bits are allowed", 17, 4, 24},
      {"three where 1 bit is allowed", 3, 1, 24},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = PictureOfColors(row.colors);
    const std::vector<uint32_t> before = Colors(*picture);
    bool packed = false;
    ASSERT_EQ(PackFewColors(*picture, row.maxBits, packed), Status::Ok);
    EXPECT_EQ(packed, row.bits != 24);
    EXPECT_EQ(picture->image.Bits(), row.bits);
    EXPECT_EQ(picture->bitsPerPixel, row.bits);
    EXPECT_EQ(Colors(*picture), before);
    for (const int32_t deeper : {4, 8, 24}) {
      ASSERT_EQ(PromotePicture(*picture, deeper), Status::Ok);
      EXPECT_GE(picture->bitsPerPixel, deeper);
      EXPECT_EQ(picture->image.Bits(), picture->bitsPerPixel);
      EXPECT_EQ(Colors(*picture), before);
    }
  }
}

TEST(Promote, RowsEndWithTheirLastPixel) {
  for (const int32_t bits : {1, 4, 8}) {
    for (int32_t width = 1; width <= 17; ++width) {
      SCOPED_TRACE(testing::Message() << bits << " bits, width " << width);
      Palette palette{};
      for (size_t i = 0; i < palette.size(); ++i) palette[i] = static_cast<uint8_t>(7 * i + 1);
      PackedImage image, promoted;
      ASSERT_EQ(NewPackedImage(width, 3, &palette, bits, image), Status::Ok);
      for (size_t i = 0; i < image.Rows().size(); ++i)
        image.Rows()[i] = static_cast<uint8_t>(91 * i + 5);
      ASSERT_EQ(PromoteImage(image, 24, promoted), Status::Ok);
      for (int32_t y = 0; y < 3; ++y) {
        for (int32_t x = 0; x < width; ++x) {
          const uint8_t* color = palette.data() + 3 * image.PixelAt(x, y);
          EXPECT_EQ(promoted.PixelAt(x, y), color[0] << 16 | color[1] << 8 | color[2]);
        }
        for (size_t i = 3 * static_cast<size_t>(width); i < promoted.Stride(); ++i)
          EXPECT_EQ(promoted.Row(y)[i], 0);
      }
    }
  }
}

}  // namespace
}  // namespace fotomill
