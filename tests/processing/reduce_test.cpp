#include "processing/palette/reduce.h"

#include <cmath>
#include <random>
#include <set>

#include "platform/fault.h"
#include "processing/color/nearest_color.h"
#include "processing/pictures.h"

namespace fotomill {
namespace {

using test::Colors;
using test::MakePicture;

uint32_t Gray(int32_t level) { return static_cast<uint32_t>(level) * 0x010101u; }

PicturePointer Sweep(int32_t width, int32_t height) {
  return MakePicture(width, height, [=](int32_t x, int32_t y) {
    return static_cast<uint32_t>(x * 255 / width << 16 | y * 255 / height << 8 |
                                 (x + y) * 255 / (width + height));
  });
}

TEST(Reduce, DepthFollowsTheMaximum) {
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
      // The image's table and the record's palette agree.
      for (int32_t i = 0; i < picture->image.Colors(); ++i) {
        for (int32_t c = 0; c < 3; ++c) {
          EXPECT_EQ(picture->image.ColorTable()[static_cast<size_t>(4 * i + 2 - c)],
                    picture->palette[static_cast<size_t>(3 * i + c)]);
        }
      }
    }
  }
  PicturePointer nothing = NewPictureRecord();
  EXPECT_EQ(ReduceColors(*nothing, 8, {}), Status::EmptyImage);
}

TEST(Reduce, FewColorsAreKeptExactly) {
  for (const int32_t bits : {1, 4, 8}) {
    SCOPED_TRACE(bits);
    const PicturePointer picture = MakePicture(50, 40, [bits](int32_t x, int32_t y) {
      return test::Scatter(x, y) % (1u << bits) * 0x050301u;
    });
    const std::vector<uint32_t> before = Colors(*picture);
    ASSERT_EQ(ReduceColors(*picture, bits, {}), Status::Ok);
    EXPECT_EQ(picture->bitsPerPixel, bits);
    EXPECT_EQ(Colors(*picture), before);
  }
}

// Dithering must preserve the mean of any area, at every gray level and in both scan directions.
TEST(Reduce, DitheredGraysPreserveTheMean) {
  for (const Dither dither : {Dither::Ordered, Dither::FloydSteinberg}) {
    for (const bool serpentine : {false, true}) {
      for (int32_t level = 0; level <= 255; level += 5) {
        SCOPED_TRACE(testing::Message() << level << ", dither " << static_cast<int32_t>(dither));
        // Two pixels of other colors prevent exact packing.
        const PicturePointer picture = MakePicture(128, 128, [level](int32_t x, int32_t y) {
          return y == 0 && x < 2 ? Gray(100 + x) : Gray(level);
        });
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

TEST(Reduce, ThresholdSeparatesDarkAndBright) {
  const auto makeSteps = [] {
    return MakePicture(4, 1, [](int32_t x, int32_t) { return Gray(40 + 20 * x * x); });
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

TEST(Reduce, FlattensAlphaFirst) {
  const PicturePointer picture =
      MakePicture(20, 20, [](int32_t x, int32_t y) { return test::Scatter(x, y) & 0xffffff; });
  test::AddAlpha(*picture, [](int32_t, int32_t) { return 0; });
  picture->defaultColour = 0x102030;  // blue, green, red
  ASSERT_EQ(ReduceColors(*picture, 8, {}), Status::Ok);
  EXPECT_TRUE(picture->alpha.Empty());
  EXPECT_EQ(Colors(*picture), std::vector<uint32_t>(400, 0x302010));
}

// Peak signal-to-noise ratio in dB.
double Likeness(const std::vector<uint32_t>& a, const std::vector<uint32_t>& b) {
  double error = 0;
  for (size_t i = 0; i < a.size(); ++i) {
    for (int c = 0; c < 3; ++c)
      error += std::pow(
          static_cast<int>(a[i] >> (8 * c) & 255) - static_cast<int>(b[i] >> (8 * c) & 255), 2);
  }
  return 10 * std::log10(255.0 * 255.0 * 3 * static_cast<double>(a.size()) / error);
}

// Slightly below the values measured when they were set: the palette quality must
// not silently degrade.
TEST(Reduce, PaletteQualityDoesNotDegrade) {
  const auto waves = [](int32_t x, int32_t y) {
    const auto level = [](double t) { return static_cast<uint32_t>(127.5 + 120 * std::sin(t)); };
    return level(x / 40.0) << 16 | level(y / 30.0 + 1) << 8 | level((x + y) / 70.0);
  };
  // Two distant clusters of similar colors.
  const auto clusters = [](int32_t x, int32_t y) {
    const uint32_t noise = test::Scatter(x, y);
    return (x < 100 ? 0x181410u : 0xd8d0e0u) +
           ((noise & 7) << 16 | (noise >> 3 & 7) << 8 | (noise >> 6 & 7));
  };
  struct Row {
    const char* name;
    uint32_t (*colorAt)(int32_t, int32_t);
    int32_t bits;
    Dither dither;
    double least;
  };
  const Row rows[] = {
      {"waves, 256 colors", waves, 8, Dither::None, 32.4},
      {"waves, 256 colors, diffused", waves, 8, Dither::FloydSteinberg, 31.0},
      {"waves, 256 colors, ordered", waves, 8, Dither::Ordered, 30.2},
      {"waves, 16 colors", waves, 4, Dither::None, 21.4},
      {"waves, 16 colors, diffused", waves, 4, Dither::FloydSteinberg, 19.8},
      {"clusters, 256 colors", clusters, 8, Dither::None, 53.2},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture = MakePicture(200, 160, row.colorAt);
    const std::vector<uint32_t> before = Colors(*picture);
    ReduceOptions options;
    options.colorDither = row.dither;
    ASSERT_EQ(ReduceColors(*picture, row.bits, options), Status::Ok);
    const std::vector<uint32_t> after = Colors(*picture);
    EXPECT_GT(Likeness(before, after), row.least);
    EXPECT_GT(std::set(after.begin(), after.end()).size(), (1u << row.bits) * 9 / 10);
  }
}

TEST(Reduce, NearestColorIsNearest) {
  std::mt19937 random(11);
  for (const int32_t count : {1, 2, 16, 255, 256}) {
    for (const int32_t range : {256, 40, 3}) {  // the narrower, the more colors per cell
      SCOPED_TRACE(testing::Message() << count << " colors within " << range);
      Palette palette{};
      for (uint8_t& level : palette)
        level = static_cast<uint8_t>((256 - range) / 2 +
                                     static_cast<int32_t>(random() % static_cast<uint32_t>(range)));
      NearestColor nearest;
      ASSERT_EQ(nearest.Open(true), Status::Ok);
      nearest.SetColors(PointsOf(palette, count));
      const auto distance = [&](int32_t i, const int32_t(&bgr)[3]) {
        int32_t sum = 0;
        for (int c = 0; c < 3; ++c)
          sum += kChannelWeight[c] * static_cast<int32_t>(std::pow(
                                         palette[static_cast<size_t>(3 * i + 2 - c)] - bgr[c], 2));
        return sum;
      };
      for (int k = 0; k < 4000; ++k) {
        const int32_t bgr[3] = {static_cast<int32_t>(random() & 255),
                                static_cast<int32_t>(random() & 255),
                                static_cast<int32_t>(random() & 255)};
        int32_t least = INT32_MAX;
        for (int32_t i = 0; i < count; ++i) least = std::min(least, distance(i, bgr));
        ASSERT_EQ(distance(nearest.Find(bgr[0], bgr[1], bgr[2]), bgr), least);
        ASSERT_EQ(distance(nearest.FindPoint({16 * bgr[0], 16 * bgr[1], 16 * bgr[2]}), bgr), least);
      }
    }
  }
}

TEST(Reduce, GraysAreEvenlySpaced) {
  for (const int32_t levels : {0, 2, 5}) {
    SCOPED_TRACE(levels);
    const PicturePointer picture = Sweep(90, 70);
    ReduceOptions options;
    options.grays = true;
    options.grayLevels = levels;
    ASSERT_EQ(ReduceColors(*picture, 4, options), Status::Ok);
    std::set<uint32_t> used;
    for (const uint32_t color : Colors(*picture)) used.insert(color);
    for (const uint32_t color : used) EXPECT_EQ(color, Gray(static_cast<int32_t>(color & 255)));
    EXPECT_LE(used.size(), static_cast<size_t>(levels == 0 ? 16 : levels));
    EXPECT_GE(used.size(), static_cast<size_t>(levels == 0 ? 14 : levels));
  }
}

TEST(Reduce, AdjustmentsMoveTheMean) {
  struct Row {
    const char* name;
    int32_t brightness, contrast;
    double mean;
  };
  for (const Row& row : {Row{"as it is", 0, 0, 63.5},
                         {"brighter", 20, 0, 114.5},
                         {"darker", -100, 0, 0},
                         {"all gray", 0, -100, 128},
                         {"doubled", 0, 100, 31.75}}) {
    SCOPED_TRACE(row.name);
    const PicturePointer picture =
        MakePicture(256, 64, [](int32_t x, int32_t) { return Gray(x / 2); });
    ReduceOptions options;
    options.brightness = row.brightness;
    options.contrast = row.contrast;
    ASSERT_EQ(ReduceColors(*picture, 1, options), Status::Ok);
    double sum = 0;
    for (const uint32_t color : Colors(*picture)) sum += color & 255;
    EXPECT_NEAR(sum / (256 * 64), row.mean, 3);
  }
}

TEST(Reduce, LackOfMemoryLeavesThePictureValid) {
  for (const int32_t bits : {1, 4, 8}) {
    SCOPED_TRACE(bits);
    const PicturePointer picture = Sweep(40, 30);
    const std::vector<uint32_t> before = Colors(*picture);
    Status status = Status::MemoryAllocationError;
    for (int64_t failing = 1; status != Status::Ok && failing < 100; ++failing) {
      platform::faultCountdown = failing;
      status = ReduceColors(*picture, bits, {});
      platform::faultCountdown = 0;
      if (status == Status::Ok) break;
      EXPECT_EQ(status, Status::MemoryAllocationError);
      EXPECT_EQ(picture->bitsPerPixel, 24);
      EXPECT_EQ(Colors(*picture), before);
    }
    EXPECT_EQ(picture->bitsPerPixel, bits);
  }
}

}  // namespace
}  // namespace fotomill
