#include "processing/reduce.h"

#include <cmath>

#include "processing/pictures.h"

namespace fotomill {
namespace {

using test::Colors;
using test::MakePicture;

uint32_t Grey(int32_t level) {
  return static_cast<uint32_t>(level) * 0x010101u;
}

PicturePointer Sweep(int32_t width, int32_t height) {
  return MakePicture(width, height, [=](int32_t x, int32_t y) {
    return static_cast<uint32_t>(x * 255 / width << 16 | y * 255 / height << 8 | (x + y) * 255 / (width + height));
  });
}

TEST(Reduce, DepthFollowsTheAim) {
  struct Row {
    int32_t aim, bits;
  };
  for (const Row row : {Row{24, 24}, {32, 24}, {8, 8}, {4, 4}, {7, 4}, {2, 1}, {1, 1}, {0, 1}}) {
    for (const Dither dither : {Dither::None, Dither::Ordered, Dither::FloydSteinberg}) {
      SCOPED_TRACE(testing::Message() << "aim " << row.aim << ", dither " << static_cast<int32_t>(dither));
      const PicturePointer picture = Sweep(61, 47);
      ReduceOptions options;
      options.colorDither = options.monoDither = dither;
      ASSERT_EQ(ReduceColors(*picture, row.aim, options), Status::Ok);
      EXPECT_EQ(picture->image.Bits(), row.bits);
      EXPECT_EQ(picture->bitsPerPixel, row.bits);
      EXPECT_EQ(picture->image.Width(), 61);
      // The image's own table and the record's palette say the same.
      for (int32_t i = 0; i < picture->image.Colors(); ++i) {
        for (int32_t c = 0; c < 3; ++c) {
          EXPECT_EQ(picture->image.ColorTable()[static_cast<size_t>(4 * i + 2 - c)],
                    picture->palette[static_cast<size_t>(3 * i + c)]);
        }
      }
    }
  }
  PicturePointer nothing = NewPictureRecord();
  EXPECT_EQ(ReduceColors(*nothing, 8), Status::EmptyImage);
}

TEST(Reduce, FewColorsAreKeptExactly) {
  for (const int32_t bits : {1, 4, 8}) {
    SCOPED_TRACE(bits);
    const PicturePointer picture =
        MakePicture(50, 40, [bits](int32_t x, int32_t y) { return test::Scatter(x, y) % (1u << bits) * 0x050301u; });
    const std::vector<uint32_t> before = Colors(*picture);
    ASSERT_EQ(ReduceColors(*picture, bits), Status::Ok);
    EXPECT_EQ(picture->bitsPerPixel, bits);
    EXPECT_EQ(Colors(*picture), before);
  }
}

// Dithering must keep the mean of any area, at every level of grey and in both directions of travel.
TEST(Reduce, DitheredGreysKeepTheirMean) {
  for (const Dither dither : {Dither::Ordered, Dither::FloydSteinberg}) {
    for (const bool serpentine : {false, true}) {
      for (int32_t level = 0; level <= 255; level += 5) {
        SCOPED_TRACE(testing::Message() << level << ", dither " << static_cast<int32_t>(dither));
        // Two pixels of other colours keep the picture from being packed exactly.
        const PicturePointer picture = MakePicture(
            128, 128, [level](int32_t x, int32_t y) { return y == 0 && x < 2 ? Grey(100 + x) : Grey(level); });
        ReduceOptions options;
        options.monoDither = dither;
        options.serpentine = serpentine;
        ASSERT_EQ(ReduceColors(*picture, 1, options), Status::Ok);
        double sum = 0;
        for (const uint32_t color : Colors(*picture)) sum += color & 255;
        EXPECT_NEAR(sum / (128 * 128), level, 2.5);
      }
    }
  }
}

TEST(Reduce, ThresholdPartsDarkFromBright) {
  const auto makeSteps = [] {
    return MakePicture(4, 1, [](int32_t x, int32_t) { return Grey(40 + 20 * x * x); });
  };  // 40 60 120 220
  struct Row {
    const char* name;
    int32_t threshold;
    std::vector<uint32_t> expected;
  };
  const uint32_t black = 0, white = 0xffffff;
  const Row rows[] = {
      {"fixed", 60, {black, white, white, white}},
      {"just above", 61, {black, black, white, white}},
      {"found from the picture", 0, {black, black, black, white}},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = makeSteps();
    ReduceOptions options;
    options.monoDither = Dither::None;
    options.threshold = row.threshold;
    ASSERT_EQ(ReduceColors(*picture, 1, options), Status::Ok);
    EXPECT_EQ(Colors(*picture), row.expected);
  }
}

TEST(Reduce, AlphaGoesToTheBackgroundFirst) {
  const PicturePointer picture =
      MakePicture(20, 20, [](int32_t x, int32_t y) { return test::Scatter(x, y) & 0xffffff; });
  test::AddAlpha(*picture, [](int32_t, int32_t) { return 0; });
  picture->defaultColour = 0x102030;  // blue, green, red
  ASSERT_EQ(ReduceColors(*picture, 8), Status::Ok);
  EXPECT_TRUE(picture->alpha.Empty());
  EXPECT_EQ(Colors(*picture), std::vector<uint32_t>(400, 0x302010));
}

}  // namespace
}  // namespace fotomill
