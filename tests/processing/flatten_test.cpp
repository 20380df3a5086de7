#include "processing/flatten.h"

#include "processing/color/blend.h"
#include "processing/pictures.h"
#include "processing/promote.h"

namespace fotomill {
namespace {

TEST(Flatten, BlendIsTheRoundedQuotientForEveryInput) {
  int32_t wrong = 0;
  for (int32_t alpha = 0; alpha < 256; ++alpha) {
    for (int32_t background = 0; background < 256; ++background) {
      for (int32_t pixel = 0; pixel < 256; ++pixel) {
        const int32_t expected = (background * (255 - alpha) + pixel * alpha + 127) / 255;
        wrong += Blend(static_cast<uint8_t>(background), static_cast<uint8_t>(pixel),
                       static_cast<uint8_t>(alpha)) != expected;
      }
    }
  }
  EXPECT_EQ(wrong, 0);
}

TEST(Flatten, UsesEachPixelsAlphaAtEveryWidth) {
  for (int32_t width = 1; width < 200; width += width < 70 ? 1 : 43) {
    for (const bool own : {false, true}) {
      const PicturePointer picture = test::MakePicture(
          width, 3, [](int32_t x, int32_t y) { return test::Scatter(x, y) & 0xffffff; });
      const std::vector<uint32_t> before = test::Colors(*picture);
      const auto alphaAt = [](int32_t x, int32_t y) {
        return y == 0 ? 255 : static_cast<int32_t>(test::Scatter(x, -y) & 255);
      };
      test::AddAlpha(*picture, alphaAt);
      picture->defaultColour = own ? 0 : 0x302010;
      picture->background = own ? 0x302010 : 0;
      picture->alphaFlags |= own ? kFlattenOnBackground : 0;
      ASSERT_EQ(FlattenAlpha(*picture), Status::Ok);
      EXPECT_TRUE(picture->alpha.Empty());
      EXPECT_EQ(picture->alphaFlags & kHasAlpha, 0);
      for (int32_t y = 0; y < 3; ++y) {
        for (int32_t x = 0; x < width; ++x) {
          const uint32_t color = before[static_cast<size_t>(y * width + x)];
          for (int c = 0; c < 3; ++c) {
            const auto pixel = static_cast<uint8_t>(color >> (8 * c)),
                       background = static_cast<uint8_t>(0x102030 >> (8 * c));
            ASSERT_EQ(test::ColorAt(*picture, x, y) >> (8 * c) & 255,
                      Blend(background, pixel, static_cast<uint8_t>(alphaAt(x, y))))
                << x << ", " << y << ", width " << width;
          }
        }
      }
    }
  }
}

TEST(Flatten, PalettePicturesAreBlendedToo) {
  struct Row {
    const char* name;
    uint32_t colors;
    int32_t lowest, bits;  // minimum alpha; resulting depth
  };
  const Row rows[] = {
      {"opaque stays as it is", 2, 255, 1},
      {"the background is a third color", 2, 0, 4},
      {"shades need more", 16, 250, 8},
      {"too many shades", 256, 0, 24},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = test::MakePicture(60, 50, [&](int32_t x, int32_t y) {
      return (test::Scatter(x, y) % row.colors) * 0x000403u;
    });
    const auto alphaAt = [&](int32_t x, int32_t y) {
      return row.lowest + (row.lowest == 0 && row.colors == 2 ? (x + y) % 2 * 255
                                                              : (x * y) % (256 - row.lowest));
    };
    const PicturePointer deep = test::MakePicture(
        60, 50, [&](int32_t x, int32_t y) { return test::ColorAt(*picture, x, y); });
    test::AddAlpha(*picture, alphaAt);
    test::AddAlpha(*deep, alphaAt);
    bool packed = false;
    ASSERT_EQ(PackFewColors(*picture, 8, packed), Status::Ok);
    picture->defaultColour = deep->defaultColour = 0xff0000;
    ASSERT_EQ(FlattenAlpha(*picture), Status::Ok);
    ASSERT_EQ(FlattenAlpha(*deep), Status::Ok);
    EXPECT_EQ(picture->bitsPerPixel, row.bits);
    EXPECT_EQ(picture->image.Bits(), row.bits);
    EXPECT_EQ(test::Colors(*picture), test::Colors(*deep));
  }
}

}  // namespace
}  // namespace fotomill
