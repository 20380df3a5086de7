#include "processing/geometry/scale.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <numbers>
#include <random>

#include "core/choice_lists.h"
#include "platform/fault.h"
#include "processing/geometry/orient.h"
#include "processing/geometry/resample_kernels.h"
#include "processing/pictures.h"
#include "processing/promote.h"

namespace fotomill {
namespace {

using test::Colors;
using test::MakePicture;
using test::Scatter;

constexpr ScaleFilter kFilters[] = {ScaleFilter::Lanczos, ScaleFilter::Bicubic,
                                    ScaleFilter::Bilinear, ScaleFilter::Nearest};

TEST(Scale, Sizes) {
  struct Row {
    const char* name;
    Size source, fit96;
    int32_t percentage;
    Size scaled;
  };
  const Row rows[] = {
      {"wide", {4000, 3000}, {96, 72}, 50, {2000, 1500}},
      {"tall, cut off", {48, 200}, {23, 96}, 48, {23, 96}},
      {"half rounds up", {192, 3}, {96, 2}, 33, {63, 1}},
      {"small is enlarged", {10, 7}, {96, 67}, 100, {10, 7}},
      {"a thread keeps a pixel", {1000, 1}, {96, 1}, 9, {90, 1}},
      {"a point", {1, 1}, {96, 96}, 0, {1, 1}},
      {"beyond all numbers", {2000000000, 1}, {96, 1}, 500, {2147483647, 5}},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Size fit = FitSize(row.source.width, row.source.height, 96);
    EXPECT_EQ(fit.width, row.fit96.width);
    EXPECT_EQ(fit.height, row.fit96.height);
    const Size scaled = SizeAtPercentage(row.source.width, row.source.height, row.percentage);
    EXPECT_EQ(scaled.width, row.scaled.width);
    EXPECT_EQ(scaled.height, row.scaled.height);
  }
}

TEST(Scale, KeysSelectTheListedFilter) {
  constexpr std::pair<const char*, ScaleFilter> names[] = {{"Lanczos", ScaleFilter::Lanczos},
                                                           {"Bicubic", ScaleFilter::Bicubic},
                                                           {"Bilinear", ScaleFilter::Bilinear},
                                                           {"Nearest", ScaleFilter::Nearest}};
  const ChoiceEntry* entry = kResampleChoices;
  for (; entry->text != nullptr; ++entry) {
    for (const auto& [name, filter] : names) {
      EXPECT_EQ(ScaleFilterFromKey(entry->value) == filter, std::string_view(entry->text).starts_with(name))
          << entry->text << name;
    }
  }
  EXPECT_EQ(ScaleFilterFromKey(-1), ScaleFilter::Bicubic);
  EXPECT_EQ(ScaleFilterFromKey(INT32_MAX), ScaleFilter::Nearest);
}

// Reference values: the filter's definition in floating point, pixel by pixel, in both directions
// at once.
struct Reference {
  ScaleFilter filter;
  double Shape(double x) const {
    x = std::abs(x);
    const auto sinc = [](double t) {
      return t == 0 ? 1.0 : std::sin(std::numbers::pi * t) / (std::numbers::pi * t);
    };
    switch (filter) {
      case ScaleFilter::Bilinear: return x < 1 ? 1 - x : 0;
      case ScaleFilter::Bicubic:
        return x < 1   ? 1.5 * x * x * x - 2.5 * x * x + 1
               : x < 2 ? -0.5 * x * x * x + 2.5 * x * x - 4 * x + 2
                       : 0;
      default: return x < 3 ? sinc(x) * sinc(x / 3) : 0;
    }
  }
  std::vector<double> Weights(int32_t i, int32_t count, int32_t sourceCount) const {
    const double scale = static_cast<double>(sourceCount) / count, widen = std::max(scale, 1.0);
    std::vector<double> weights(static_cast<size_t>(sourceCount));
    double sum = 0;
    for (int32_t s = 0; s < sourceCount; ++s) {
      sum += weights[static_cast<size_t>(s)] = Shape((s + 0.5 - (i + 0.5) * scale) / widen);
    }
    for (double& w : weights) w /= sum;
    return weights;
  }
  // Blue, green, red and alpha of every pixel of the result, row by row, not premultiplied.
  std::vector<std::array<double, 4>> Scale(const PictureRecord& picture, Size size) const {
    const int32_t width = picture.image.Width(), height = picture.image.Height();
    std::vector<std::array<double, 4>> narrow(static_cast<size_t>(size.width * height)),
        scaled(static_cast<size_t>(size.width * size.height));
    for (int32_t x = 0; x < size.width; ++x) {
      const auto weights = Weights(x, size.width, width);
      for (int32_t i = 0; i < width * height; ++i) {
        const double alpha =
            picture.alpha.Empty() ? 255 : picture.alpha.PixelAt(i % width, i / width);
        const double weight = weights[static_cast<size_t>(i % width)] * alpha / 255;
        auto& sum = narrow[static_cast<size_t>(i / width * size.width + x)];
        const uint32_t color = test::ColorAt(picture, i % width, i / width);
        for (size_t c = 0; c < 3; ++c) sum[c] += weight * (color >> (8 * c) & 255);
        sum[3] += weight * 255;
      }
    }
    for (int32_t y = 0; y < size.height; ++y) {
      const auto weights = Weights(y, size.height, height);
      for (int32_t i = 0; i < size.width * height; ++i) {
        auto& sum = scaled[static_cast<size_t>(y * size.width + i % size.width)];
        for (size_t c = 0; c < 4; ++c)
          sum[c] +=
              weights[static_cast<size_t>(i / size.width)] * narrow[static_cast<size_t>(i)][c];
      }
    }
    for (auto& sum : scaled) {
      for (size_t c = 0; c < 3; ++c)
        sum[c] = std::clamp(sum[3] <= 0 ? 0.0 : sum[c] * 255 / sum[3], 0.0, 255.0);
      sum[3] = std::clamp(sum[3], 0.0, 255.0);
    }
    return scaled;
  }
};

TEST(Scale, MatchesTheFiltersDefinition) {
  struct Row {
    const char* name;
    Size source, size;
    bool alpha;
  };
  const Row rows[] = {
      {"shrinks", {67, 41}, {29, 17}, false},
      {"grows", {13, 9}, {41, 38}, false},
      {"shrinks with alpha", {67, 41}, {29, 17}, true},
      {"grows with alpha", {13, 9}, {41, 38}, true},
      {"wider and lower", {30, 50}, {70, 11}, false},
      {"narrower and higher", {90, 12}, {25, 40}, true},
      {"too narrow for a vector", {5, 40}, {3, 9}, false},
      {"same size", {33, 20}, {33, 20}, false},
  };
  for (const Row& row : rows) {
    for (const ScaleFilter filter :
         {ScaleFilter::Lanczos, ScaleFilter::Bicubic, ScaleFilter::Bilinear}) {
      SCOPED_TRACE(testing::Message() << row.name << ", filter " << static_cast<int32_t>(filter));
      const PicturePointer picture =
          MakePicture(row.source.width, row.source.height,
                      [](int32_t x, int32_t y) { return Scatter(x, y) & 0xffffff; });
      if (row.alpha) {
        test::AddAlpha(*picture, [](int32_t x, int32_t y) {
          return static_cast<int32_t>(100 + Scatter(x + 99, y) % 156);
        });
      }
      PackedImage image, alpha;
      ASSERT_EQ(ScaleFiltered(picture->image, picture->alpha, row.size, filter, image, alpha), Status::Ok);
      ASSERT_EQ(image.Width(), row.size.width);
      const auto reference = Reference{filter}.Scale(*picture, row.size);
      for (int32_t y = 0; y < row.size.height; ++y) {
        for (int32_t x = 0; x < row.size.width; ++x) {
          const auto& expected = reference[static_cast<size_t>(y * row.size.width + x)];
          for (size_t c = 0; c < 3; ++c) {
            ASSERT_NEAR(image.PixelAt(x, y) >> (8 * c) & 255, expected[c], row.alpha ? 0.75 : 0.6) << x << ", " << y;
          }
          if (row.alpha) {
            ASSERT_NEAR(alpha.PixelAt(x, y), expected[3], 0.6);
          }
        }
      }
    }
  }
}

constexpr Size kOddSizes[] = {{1, 1},   {1, 7},   {9, 1},   {2, 300},
                              {300, 2}, {21, 22}, {64, 64}, {3, 1000}};

TEST(Scale, SingleColorsAreExactAtEverySize) {
  for (const uint32_t color : {0x000000u, 0xffffffu, 0x01fe80u}) {
    for (const bool alpha : {false, true}) {
      for (const Size from : kOddSizes) {
        const PicturePointer picture =
            MakePicture(from.width, from.height, [=](int32_t, int32_t) { return color; });
        if (alpha)
          test::AddAlpha(*picture,
                         [](int32_t x, int32_t y) { return (x + y) % 2 == 0 ? 255 : 128; });
        for (const Size to : kOddSizes) {
          for (const ScaleFilter filter : kFilters) {
            SCOPED_TRACE(testing::Message() << from.width << " x " << from.height << " to "
                                            << to.width << " x " << to.height << ", filter "
                                            << static_cast<int32_t>(filter) << ", alpha " << alpha);
            PackedImage image, plane;
            ASSERT_EQ(ScaleFiltered(picture->image, picture->alpha, to, filter, image, plane), Status::Ok);
            for (int32_t y = 0; y < to.height; ++y) {
              for (int32_t x = 0; x < to.width; ++x) {
                for (int c = 0; c < 3; ++c) {
                  ASSERT_NEAR(image.PixelAt(x, y) >> (8 * c) & 255, static_cast<int32_t>(color >> (8 * c) & 255), alpha);
                }
              }
            }
          }
        }
      }
    }
  }
}

TEST(Scale, MirrorsStayMirrors) {
  for (const auto& [width, size] :
       {std::pair{40, Size{13, 9}}, {41, Size{100, 70}}, {400, Size{31, 20}}, {7, Size{8, 3}}}) {
    for (const ScaleFilter filter : kFilters) {
      for (const Orientation mirror : {Orientation::MirrorAcross, Orientation::MirrorDown}) {
        SCOPED_TRACE(testing::Message() << width << " to " << size.width << ", filter " << static_cast<int32_t>(filter));
        // With an odd width there is no tie at the middle pixel for Nearest.
        const PicturePointer picture = MakePicture(width, 21, [&](int32_t x, int32_t y) {
          return Scatter(std::min(x, width - 1 - x), std::min(y, 20 - y)) & 0xffffff;
        });
        ASSERT_EQ(ScalePicture(*picture, size, filter), Status::Ok);
        std::vector<uint32_t> before = Colors(*picture);
        ASSERT_EQ(OrientPicture(*picture, mirror), Status::Ok);
        const std::vector<uint32_t> after = Colors(*picture);
        for (size_t i = 0; i < before.size(); ++i) {
          const auto x = static_cast<int32_t>(i) % size.width,
                     y = static_cast<int32_t>(i) / size.width;
          // ties may be rounded differently
          if (2 * x + 1 == size.width || 2 * y + 1 == size.height) continue;
          if (filter == ScaleFilter::Nearest && width % 2 == 0) continue;
          ASSERT_EQ(before[i], after[i]) << x << ", " << y;
        }
      }
    }
  }
}

// A slope must be preserved: a shift by half a pixel would be a constant difference.
TEST(Scale, KeepsPositions) {
  for (const int32_t width : {32, 100, 255, 700}) {
    for (const ScaleFilter filter : kFilters) {
      SCOPED_TRACE(testing::Message() << "to " << width << ", filter " << static_cast<int32_t>(filter));
      const PicturePointer picture =
          MakePicture(1020, 40, [](int32_t x, int32_t) { return static_cast<uint32_t>(x / 4); });
      PackedImage image, plane;
      ASSERT_EQ(ScaleFiltered(picture->image, picture->alpha, {width, 40}, filter, image, plane), Status::Ok);
      double difference = 0;
      for (int32_t x = width / 8; x < width - width / 8; ++x)
        difference += image.PixelAt(x, 20) - ((x + 0.5) * 255 / width - 0.5);
      EXPECT_NEAR(difference / (width * 0.75), 0, 0.15);
    }
  }
}

TEST(Scale, TransparentColorsLeaveNoFringe) {
  for (const Size size : {Size{30, 30}, {200, 150}, {4, 4}, {61, 3}}) {
    for (const ScaleFilter filter : kFilters) {
      SCOPED_TRACE(testing::Message() << size.width << " x " << size.height << ", filter " << static_cast<int32_t>(filter));
      const auto inside = [](int32_t x, int32_t y) {
        return (x - 30) * (x - 30) + (y - 30) * (y - 30) < 400;
      };
      const PicturePointer picture =
          MakePicture(61, 61, [&](int32_t x, int32_t y) { return inside(x, y) ? 0xf0e0d0 : 0u; });
      test::AddAlpha(*picture, [&](int32_t x, int32_t y) { return inside(x, y) ? 255 : 0; });
      ASSERT_EQ(ScalePicture(*picture, size, filter), Status::Ok);
      int32_t seen = 0;
      for (int32_t y = 0; y < size.height; ++y) {
        for (int32_t x = 0; x < size.width; ++x) {
          if (filter != ScaleFilter::Nearest && picture->alpha.PixelAt(x, y) == 0) {
            ASSERT_EQ(picture->image.PixelAt(x, y), 0) << x << ", " << y;
          }
          if (picture->alpha.PixelAt(x, y) < 16) continue;
          ++seen;
          for (int c = 0; c < 3; ++c) {
            ASSERT_NEAR(picture->image.PixelAt(x, y) >> (8 * c) & 255, 0xf0e0d0 >> (8 * c) & 255, 1) << x << ", " << y;
          }
        }
      }
      EXPECT_GT(seen, 3);
    }
  }
}

// Block averaging must not be visible: over 45 dB compared with the full filter.
TEST(Scale, LargeReductionsStayCloseToTheFilter) {
  const auto smooth = [](int32_t x, int32_t y) {
    const auto wave = [](double t) { return static_cast<uint32_t>(127.5 + 127 * std::sin(t)); };
    return wave(x / 31.0 + y / 57.0) | wave(y / 23.0) << 8 | (Scatter(x / 9, y / 9) & 0xff0000);
  };
  const PicturePointer picture = MakePicture(531, 377, smooth);
  for (const ScaleFilter filter :
       {ScaleFilter::Lanczos, ScaleFilter::Bicubic, ScaleFilter::Bilinear}) {
    SCOPED_TRACE(static_cast<int32_t>(filter));
    const Size size{37, 26};
    PackedImage image, plane;
    ASSERT_EQ(ScaleFiltered(picture->image, picture->alpha, size, filter, image, plane), Status::Ok);
    const auto reference = Reference{filter}.Scale(*picture, size);
    double error = 0;
    for (int32_t y = 0; y < size.height; ++y) {
      for (int32_t x = 0; x < size.width; ++x) {
        const auto& expected = reference[static_cast<size_t>(y * size.width + x)];
        for (size_t c = 0; c < 3; ++c)
          error += std::pow((image.PixelAt(x, y) >> (8 * c) & 255) - expected[c], 2);
      }
    }
    EXPECT_GT(10 * std::log10(255.0 * 255.0 * 3 * size.width * size.height / error), 45);
  }
}

TEST(Scale, ThreadsAndPointsAndPalettes) {
  struct Row {
    Size source, size;
  };
  for (const Row& row : {Row{{20000, 1}, {1, 1}},
                         {{1, 20000}, {1, 1}},
                         {{1, 1}, {1, 20000}},
                         {{1, 1}, {20000, 1}},
                         {{20000, 1}, {3, 5}},
                         {{2, 20000}, {96, 1}},
                         {{30, 20}, {11, 40}}}) {
    for (const int32_t bits : {1, 4, 8}) {
      for (const ScaleFilter filter : kFilters) {
        SCOPED_TRACE(testing::Message()
                     << row.source.width << " x " << row.source.height << " to " << row.size.width
                     << " x " << row.size.height << ", " << bits << " bits, filter "
                     << static_cast<int32_t>(filter));
        const PicturePointer picture =
            MakePicture(row.source.width, row.source.height, [bits](int32_t x, int32_t y) {
              return Scatter(x, y) % (1u << bits) * (0xffffffu / ((1u << bits) - 1));
            });
        const PicturePointer deep =
            MakePicture(row.source.width, row.source.height,
                        [&](int32_t x, int32_t y) { return test::ColorAt(*picture, x, y); });
        bool packed = false;
        ASSERT_EQ(PackFewColors(*picture, 8, packed), Status::Ok);
        ASSERT_EQ(ScalePicture(*picture, row.size, filter), Status::Ok);
        ASSERT_EQ(ScalePicture(*deep, row.size, filter), Status::Ok);
        EXPECT_EQ(Colors(*picture), Colors(*deep));
        EXPECT_EQ(picture->width, row.size.width);
        EXPECT_EQ(picture->bitsPerPixel, picture->image.Bits());
      }
    }
  }
}

TEST(Scale, IsTheSameOnEveryProcessor) {
  const ResampleKernels& here = ResampleKernelsHere();
  const ResampleKernels& baseline = BaselineResampleKernels();
  std::mt19937 random(7);
  std::vector<uint8_t> bytes(8 * 256);
  std::vector<int16_t> shorts(8 * 256 + 64), weights(8);
  for (uint8_t& byte : bytes) byte = static_cast<uint8_t>(random());
  for (int16_t& value : shorts) value = static_cast<int16_t>(random() % 24000) - 4000;
  for (int16_t& weight : weights) weight = static_cast<int16_t>(random() % 8192) - 2048;
  const uint8_t* byteRows[8];
  const int16_t* shortRows[8];
  for (size_t i = 0; i < 8; ++i) byteRows[i] = &bytes[256 * i], shortRows[i] = &shorts[256 * i];
  std::vector<FilterWindow> windows;
  for (int32_t x = 0; x < 50; ++x) windows.push_back({x, x % 2 == 0 ? 4 : 8, weights.data()});

  using Run = std::function<void(const ResampleKernels&, std::vector<int16_t>&)>;
  const std::pair<const char*, Run> rows[] = {
      {"bytes", [&](auto& k, auto& out) { k.weighBytes(byteRows, windows[1], 8, 201, out.data()); }},
      {"shorts", [&](auto& k, auto& out) { k.weighShorts(shortRows, windows[1], 15, 256, out.data()); }},
      {"three", [&](auto& k, auto& out) { k.scaleThree(shorts.data(), windows.data(), 50, 14, out.data()), out[150] = 0; }},
      {"four", [&](auto& k, auto& out) { k.scaleFour(shorts.data(), windows.data(), 50, 14, out.data()); }},
      {"widen", [&](auto& k, auto& out) { k.widen(bytes.data(), 301, out.data()); }},
      {"multiply", [&](auto& k, auto& out) { k.multiply(bytes.data(), bytes.data() + 999, 77, out.data()); }},
      {"sharpen",
       [&](auto& k, auto& out) {
         std::copy_n(shorts.data(), 401, out.begin());
         k.sharpen(bytes.data(), 201, 1 << 14, 90, out.data());
         k.sharpen(bytes.data() + 201, 200, 700, 0, out.data() + 201);
       }},
      {"narrow",
       [&](auto& k, auto& out) {
         std::vector<uint8_t> levels(401);
         k.narrow(shorts.data(), 401, levels.data());
         std::copy(levels.begin(), levels.end(), out.begin());
       }},
  };
  for (const auto& [name, run] : rows) {
    SCOPED_TRACE(name);
    std::vector<int16_t> one(512, 77), other(512, 77);
    run(here, one);
    run(baseline, other);
    EXPECT_EQ(one, other);
  }
}

TEST(Scale, SharpensFromTheThresholdOn) {
  constexpr int16_t kLevel = 100 << kFraction, kWhite = 255 << kFraction;
  const uint8_t levels[] = {100, 100, 100, 100, 255, 0};
  std::vector<int16_t> samples{kLevel - 90, kLevel - 89, kLevel + 90,
                               kLevel + 89, kWhite - 95, 95};
  ResampleKernelsHere().sharpen(levels, 6, 2 << kSharpenBits, 90, samples.data());
  EXPECT_EQ(samples, (std::vector<int16_t>{kLevel + 180, kLevel, kLevel - 180, kLevel, kWhite, 0}));
}

TEST(Scale, LackOfMemoryLeavesThePictureValid) {
  for (const bool alpha : {false, true}) {
    for (const ScaleFilter filter : kFilters) {
      SCOPED_TRACE(testing::Message() << "filter " << static_cast<int32_t>(filter) << ", alpha " << alpha);
      const PicturePointer picture =
          MakePicture(50, 40, [](int32_t x, int32_t y) { return Scatter(x, y) & 0xffffff; });
      if (alpha) {
        test::AddAlpha(*picture, [](int32_t x, int32_t) { return x; });
      }
      const std::vector<uint32_t> before = Colors(*picture);
      Status status = Status::MemoryAllocationError;
      int64_t failing = 0;
      while (status != Status::Ok && failing < 100) {
        platform::faultCountdown = ++failing;
        status = ScalePicture(*picture, {3, 2}, filter);
        platform::faultCountdown = 0;
        if (status == Status::Ok) break;
        EXPECT_EQ(status, Status::MemoryAllocationError);
        EXPECT_EQ(Colors(*picture), before);
        EXPECT_EQ(picture->alpha.Empty(), !alpha);
      }
      EXPECT_GT(failing, 2);
      EXPECT_EQ(picture->width, 3);
    }
  }
}

}  // namespace
}  // namespace fotomill
