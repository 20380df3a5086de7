#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <numbers>

#include "operations/engine.h"
#include "processing/geometry/rotate.h"
#include "processing/geometry/sample_kernel.h"
#include "processing/geometry/skew.h"
#include "processing/pictures.h"
#include "processing/promote.h"

namespace fotomill::test {
namespace {

const EngineOptions kSerial;

Status Apply(PictureRecord& picture, const std::string& text) {
  Recipe recipe;
  for (const Mistake& mistake : ReadRecipe(text, {}, recipe))
    ADD_FAILURE() << text << ": " << mistake.Text();
  return ApplySteps(picture, recipe.common, kSerial);
}

// A picture of 5 x 3 pixels at any depth that uses `used` colors of its palette.
PicturePointer SmallPicture(int32_t bits, int32_t used) {
  PicturePointer picture = MakePicture(5, 3, [](int32_t x, int32_t y) {
    return static_cast<uint32_t>(0x203040 + 0x0a0000 * x + 0x11 * y);
  });
  if (bits == 24) return picture;
  Palette palette{};
  for (size_t i = 0; i < palette.size(); ++i) palette[i] = static_cast<uint8_t>(i * 7 + 3);
  EXPECT_EQ(NewPackedImage(5, 3, &palette, bits, picture->image), Status::Ok);
  picture->palette = palette;
  picture->bitsPerPixel = bits;
  for (int32_t y = 0; y < 3; ++y) {
    uint8_t indices[5];
    for (int32_t x = 0; x < 5; ++x) indices[x] = static_cast<uint8_t>((x * x + 3 * y) % used);
    PackIndices(indices, 5, bits, picture->image.Row(y).data());
  }
  return picture;
}

TEST(Transforms, KeepTheDepthWhenMovingWholePixels) {
  constexpr int32_t kNone = -1;  // the background
  struct Place {
    int32_t x, y;
  };
  const struct {
    const char* line;
    int32_t width, height;
    Place (*from)(int32_t x, int32_t y);
  } rows[] = {
      {"crop 2x2+1+1", 2, 2, [](int32_t x, int32_t y) { return Place{x + 1, y + 1}; }},
      {"crop 9x9-2-2", 5, 3, [](int32_t x, int32_t y) { return Place{x, y}; }},
      {"crop 1:1 gravity=right", 3, 3, [](int32_t x, int32_t y) { return Place{x + 2, y}; }},
      {"canvas 3x3 gravity=bottom-right", 3, 3, [](int32_t x, int32_t y) { return Place{x + 2, y}; }},
      {"canvas 7x4 background=red gravity=bottom-left", 7, 4,
       [](int32_t x, int32_t y) { return x < 5 && y > 0 ? Place{x, y - 1} : Place{kNone, 0}; }},
      {"canvas 3x5 background=#ff0000", 3, 5, [](int32_t x, int32_t y) { return y > 0 && y < 4 ? Place{x + 1, y - 1} : Place{kNone, 0}; }},
      {"offset 1 0", 5, 3, [](int32_t x, int32_t y) { return Place{(x + 4) % 5, y}; }},
      {"offset -1 -4", 5, 3, [](int32_t x, int32_t y) { return Place{(x + 1) % 5, (y + 1) % 3}; }},
      {"offset 40% 100%", 5, 3, [](int32_t x, int32_t y) { return Place{(x + 3) % 5, y}; }},
      {"rotate 90", 3, 5, [](int32_t x, int32_t y) { return Place{y, 2 - x}; }},
      {"rotate -90", 3, 5, [](int32_t x, int32_t y) { return Place{4 - y, x}; }},
      {"rotate 90 background=red mode=keep", 5, 3,
       [](int32_t x, int32_t y) { return x > 0 && x < 4 ? Place{y + 1, 3 - x} : Place{kNone, 0}; }},
      {"rotate -180", 5, 3, [](int32_t x, int32_t y) { return Place{4 - x, 2 - y}; }},
  };
  for (const auto& row : rows) {
    for (const int32_t bits : {1, 4, 8, 24}) {
      SCOPED_TRACE(std::string(row.line) + ", bits " + std::to_string(bits));
      const int32_t used = bits == 1 ? 2 : 7;
      const PicturePointer picture = SmallPicture(bits, used), source = SmallPicture(bits, used);
      ASSERT_EQ(Apply(*picture, row.line), Status::Ok);
      ASSERT_EQ(picture->image.Width(), row.width);
      ASSERT_EQ(picture->image.Height(), row.height);
      bool hasBackground = false;
      for (int32_t y = 0; y < row.height; ++y) {
        for (int32_t x = 0; x < row.width; ++x) {
          const Place from = row.from(x, y);
          hasBackground |= from.x == kNone;
          EXPECT_EQ(ColorAt(*picture, x, y), from.x == kNone ? 0xff0000 : ColorAt(*source, from.x, from.y)) << x << ", " << y;
        }
      }
      EXPECT_EQ(picture->image.Bits(), bits == 1 && hasBackground ? 24 : bits) << "a palette without a free entry is promoted";
    }
  }
}

TEST(Transforms, TransparentCanvasAddsAlpha) {
  for (const int32_t bits : {1, 8, 24}) {
    const PicturePointer picture = SmallPicture(bits, 2);
    ASSERT_EQ(Apply(*picture, "canvas 6x3 gravity=left background=#00000000"), Status::Ok);
    EXPECT_EQ(picture->image.Bits(), bits);
    EXPECT_EQ(picture->alpha.PixelAt(4, 1), 255);
    EXPECT_EQ(picture->alpha.PixelAt(5, 1), 0);
  }
}

TEST(Transforms, TrimRemovesTheBorder) {
  const struct {
    const char* line;
    Rectangle kept;
  } rows[] = {
      {"trim", {3, 2, 12, 6}}, {"trim 9", {3, 2, 12, 6}}, {"trim 10", {5, 4, 1, 1}}, {"trim 10 margin=2", {3, 2, 5, 5}},
      {"trim margin=500", {0, 0, 20, 11}}, {"trim 255", {0, 0, 20, 11}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.line);
    const PicturePointer picture = MakePicture(20, 11, [](int32_t x, int32_t y) {
      if (x == 5 && y == 4) return 0xff00ffu;
      return (x == 3 && y == 2) || (x == 14 && y == 7) ? 0x6e6464u : 0x646464u;
    });
    const std::vector<uint32_t> before = Colors(*picture);
    ASSERT_EQ(Apply(*picture, row.line), Status::Ok);
    std::vector<uint32_t> kept;
    for (int32_t y = 0; y < row.kept.height; ++y) {
      for (int32_t x = 0; x < row.kept.width; ++x)
        kept.push_back(before[static_cast<size_t>((y + row.kept.y) * 20 + x + row.kept.x)]);
    }
    EXPECT_EQ(picture->image.Width(), row.kept.width);
    EXPECT_EQ(Colors(*picture), kept);
  }
}

// Reference interpolation: pixels weighted by a kernel, colors by alpha, too; the backdrop outside.
struct Sampler {
  const PictureRecord& picture;
  double (*kernel)(double);
  bool repeat;
  uint32_t background;
  double backgroundAlpha;

  std::array<double, 4> At(double u, double v) const {
    std::array<double, 4> sums{};
    const int32_t width = picture.image.Width(), height = picture.image.Height();
    for (auto y = static_cast<int32_t>(std::floor(v)) - 1; y <= std::floor(v) + 2; ++y) {
      for (auto x = static_cast<int32_t>(std::floor(u)) - 1; x <= std::floor(u) + 2; ++x) {
        const int32_t i = std::clamp(x, 0, width - 1), j = std::clamp(y, 0, height - 1);
        const bool inside = repeat || (i == x && j == y);
        const uint32_t color = inside ? ColorAt(picture, i, j) : background;
        const double own = picture.alpha.Empty() ? 255 : picture.alpha.PixelAt(i, j);
        const double weight = kernel(x - u) * kernel(y - v) * (inside ? own : backgroundAlpha);
        for (size_t c = 0; c < 3; ++c) sums[c] += weight * (color >> (8 * c) & 255);
        sums[3] += weight;
      }
    }
    for (size_t c = 0; c < 3; ++c)
      sums[c] = std::clamp(sums[c] / std::max(sums[3], 1e-9), 0.0, 255.0);
    sums[3] = std::clamp(sums[3], 0.0, 255.0);
    return sums;
  }
};

double Cubic(double x) {
  x = std::abs(x);
  return x < 1   ? 1.5 * x * x * x - 2.5 * x * x + 1
         : x < 2 ? -0.5 * x * x * x + 2.5 * x * x - 4 * x + 2
                 : 0;
}
double Tent(double x) { return std::max(0.0, 1 - std::abs(x)); }

struct Spot {
  double x, y;  // relative to the center, in result and source
};
constexpr double kDegree = std::numbers::pi / 180;
Spot Turned(Spot spot, double degrees) {
  const double c = std::cos(degrees * kDegree), s = std::sin(degrees * kDegree);
  return {c * spot.x + s * spot.y, c * spot.y - s * spot.x};
}

TEST(Transforms, SampleAccordingToTheFormula) {
  const struct {
    const char* line;
    int32_t width, height;
    double (*kernel)(double);
    bool repeat;
    Spot (*from)(Spot spot);
  } rows[] = {
      {"rotate 7 background=red", 45, 34, Cubic, false, [](Spot p) { return Turned(p, 7); }},
      {"rotate -33 background=red mode=keep filter=bilinear", 41, 29, Tent, false,
       [](Spot p) { return Turned(p, -33); }},
      {"rotate 200 background=red", 49, 42, Cubic, false, [](Spot p) { return Turned(p, 200); }},
      {"straighten 3", 39, 26, Cubic, true, [](Spot p) { return Turned(p, 3); }},
      {"shear 20 background=red", 52, 29, Cubic, false,
       [](Spot p) {
         return Spot{p.x - std::tan(20 * kDegree) * p.y, p.y};
       }},
      {"shear down=20 background=red", 41, 44, Cubic, false,
       [](Spot p) {
         return Spot{p.x, p.y - std::tan(20 * kDegree) * p.x};
       }},
      {"perspective 5,0 41,4 41,29 5,25 background=red filter=bilinear", 36, 25, Tent, false,
       [](Spot p) {
         return Spot{p.x + 18 + 5 - 20.5, p.y + 12.5 + (p.x + 18) / 36 * 4 - 14.5};
       }},
      {"wave 4 30", 41, 29, Cubic, true,
       [](Spot p) {
         return Spot{p.x, p.y - 4 * std::sin(2 * std::numbers::pi * (p.x + 20) / 30)};
       }},
      {"wave 4 30 horizontal", 41, 29, Cubic, true,
       [](Spot p) {
         return Spot{p.x - 4 * std::sin(2 * std::numbers::pi * (p.y + 14) / 30), p.y};
       }},
      {"ripple 3 20", 41, 29, Cubic, true,
       [](Spot p) {
         const double r = std::hypot(p.x, p.y),
                      way = r == 0 ? 0 : 3 * std::sin(2 * std::numbers::pi * r / 20) / r;
         return Spot{p.x * (1 - way), p.y * (1 - way)};
       }},
      {"swirl 100 radius=14", 41, 29, Cubic, true,
       [](Spot p) {
         const double share = std::max(0.0, 1 - std::hypot(p.x, p.y) / 14);
         return Turned(p, 100 * share * share);
       }},
      {"bulge 60% radius=14", 41, 29, Cubic, true,
       [](Spot p) {
         const double share = std::max(0.0, 1 - (p.x * p.x + p.y * p.y) / 196),
                      scale = 1 - 0.6 * share * share;
         return Spot{p.x * scale, p.y * scale};
       }},
  };
  for (const auto& row : rows) {
    for (const bool alpha : {false, true}) {
      SCOPED_TRACE(std::string(row.line) + (alpha ? " with alpha" : ""));
      const auto make = [&] {
        PicturePointer picture = MakePicture(
            41, 29, [](int32_t x, int32_t y) { return Scatter(x / 2, y / 3) & 0xffffff; });
        if (alpha)
          AddAlpha(*picture,
                   [](int32_t x, int32_t y) { return x < 15 ? 0 : std::min(255, 6 * x + y); });
        return picture;
      };
      const PicturePointer picture = make(), source = make();
      ASSERT_EQ(Apply(*picture, row.line), Status::Ok);
      ASSERT_EQ(picture->image.Width(), row.width);
      ASSERT_EQ(picture->image.Height(), row.height);
      const Sampler sampler{*source, row.kernel, row.repeat, 0xff0000, 255};
      for (int32_t y = 0; y < row.height; ++y) {
        for (int32_t x = 0; x < row.width; ++x) {
          const Spot from = row.from({x - (row.width - 1) / 2.0, y - (row.height - 1) / 2.0});
          const auto expected = sampler.At(from.x + 20, from.y + 14);
          if (alpha) {
            ASSERT_NEAR(picture->alpha.PixelAt(x, y), expected[3], 1.5) << x << ", " << y;
          }
          if (alpha && expected[3] < 40) continue;
          for (size_t c = 0; c < 3; ++c)
            ASSERT_NEAR(ColorAt(*picture, x, y) >> (8 * c) & 255, expected[c], alpha ? 4 : 1.5)
                << x << ", " << y;
        }
      }
    }
  }
}

TEST(Transforms, SamplesAreTheSameOnEveryProcessor) {
  for (int32_t n = 0; n < 20000; ++n) {
    uint8_t rows[4][16];
    for (int32_t i = 0; i < 64; ++i) {
      const uint32_t chance = Scatter(n, i);
      rows[i / 16][i % 16] = static_cast<uint8_t>(n % 2 == 0 ? chance : (chance & 1) * 255);
    }
    Weights weights[2];
    for (auto& line : weights) {
      const double place = (Scatter(n, &line == weights ? 99 : 98) & 1023) / 1024.0;
      for (int i = 0; i < 4; ++i)
        line[i] = static_cast<int16_t>(std::lround(Cubic(i - 1 - place) * kWeightOne));
    }
    const uint8_t* const pointers[] = {rows[0], rows[1], rows[2], rows[3]};
    uint8_t here[3], plain[3];
    SampleBgr(pointers, weights[0], weights[1], here);
    SampleBgrPlain(pointers, weights[0], weights[1], plain);
    ASSERT_TRUE(std::ranges::equal(here, plain)) << n;
  }
}

TEST(Transforms, DetectSkew) {
  for (const double angle : {0.0, 1.3, -4.75, 11.0}) {
    const double slope = std::tan(angle * kDegree);
    const PicturePointer page = MakePicture(700, 500, [&](int32_t x, int32_t y) {
      const double line = y - slope * x + 1000;
      return std::fmod(line, 24) < 10 && x > 50 && x < 650 &&
                     Scatter(x / 5, static_cast<int32_t>(line / 24)) % 4 != 0
                 ? 0x202020u
                 : 0xf0f0e8u;
    });
    double found = 99;
    ASSERT_EQ(FindSkew(*page, 15, {}, found), Status::Ok);
    EXPECT_NEAR(found, angle, 0.1);
  }
  double found = 99;
  ASSERT_EQ(FindSkew(*MakePicture(50, 50, [](int32_t, int32_t) { return 0x808080u; }), 15, {}, found), Status::Ok);
  EXPECT_EQ(found, 0);
}

TEST(Transforms, RejectInvalidResults) {
  const struct {
    const char* line;
    Status status;
  } rows[] = {
      {"perspective 0,0 0,10 10,10 10,0", Status::EmptyImage},  // mirrored
      {"perspective 5,5 5,5 5,5 5,5", Status::EmptyImage},
      {"perspective size=1000000x1000000", Status::MemoryAllocationError},
      {"canvas 1000000x1000000", Status::MemoryAllocationError},
  };
  for (const auto& row : rows) {
    const PicturePointer picture = SmallPicture(24, 0);
    EXPECT_EQ(Apply(*picture, row.line), row.status) << row.line;
    EXPECT_EQ(picture->image.Width(), 5);
  }
}

}  // namespace
}  // namespace fotomill::test
