#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <map>

#include "operations/engine.h"
#include "processing/filters/mosaic.h"
#include "processing/pictures.h"

namespace fotomill::test {
namespace {

const EngineOptions kSerial;
constexpr int32_t kWidth = 31, kHeight = 19;

Status Apply(PictureRecord& picture, const std::string& text) {
  Recipe recipe;
  for (const Mistake& mistake : ReadRecipe(text, {}, recipe))
    ADD_FAILURE() << text << ": " << mistake.Text();
  return ApplySteps(picture, recipe.common, kSerial);
}

PicturePointer Source() {
  return MakePicture(kWidth, kHeight,
                     [](int32_t x, int32_t y) { return Scatter(x / 3, y / 2) & 0xffffff; });
}

// A channel of a picture with repeated edges.
struct Channel {
  const PictureRecord& picture;
  int shift;
  int32_t operator()(int32_t x, int32_t y) const {
    return static_cast<int32_t>(
        ColorAt(picture, std::clamp(x, 0, kWidth - 1), std::clamp(y, 0, kHeight - 1)) >> shift &
        255);
  }
};

double Clamped(double value) { return std::floor(std::clamp(value, 0.0, 255.0) + 0.5); }

double Slope(const Channel& at, int32_t x, int32_t y, bool across) {
  double sum = 0;
  for (int32_t i = -1; i <= 1; ++i) {
    const int32_t weight = i == 0 ? 2 : 1;
    sum += across ? weight * (at(x + 1, y + i) - at(x - 1, y + i))
                  : weight * (at(x + i, y + 1) - at(x + i, y - 1));
  }
  return sum;
}

double MeanAlong(const Channel& at, int32_t x, int32_t y, int32_t dx, int32_t dy, int32_t reach) {
  double sum = 0;
  for (int32_t i = -reach; i <= reach; ++i) sum += at(x + i * dx, y + i * dy);
  return sum / (2 * reach + 1);
}

double Median3(const Channel& at, int32_t x, int32_t y) {
  std::vector<int32_t> levels;
  for (int32_t i = 0; i < 9; ++i) levels.push_back(at(x + i % 3 - 1, y + i / 3 - 1));
  std::ranges::sort(levels);
  return levels[4];
}

TEST(Filters, MatchTheirFormulas) {
  const struct {
    const char* line;
    double (*of)(const Channel& at, int32_t x, int32_t y);
    double tolerance;
  } rows[] = {
      {"kernel '0 -1 0, -1 5 -1, 0 -1 0'",
       [](const Channel& at, int32_t x, int32_t y) {
         return 5.0 * at(x, y) - at(x - 1, y) - at(x + 1, y) - at(x, y - 1) - at(x, y + 1);
       },
       0},
      {"kernel '0 0 0 0 0 0 0 0 0 0 0 0 0 0 2.5 0 0 0 0 0 0 0 0 0 0' divisor=2 bias=-20",  // two pixels to the right
       [](const Channel& at, int32_t x, int32_t y) { return at(x + 2, y) * 1.25 - 20; }, 0},
      {"kernel '1 0 -1 1 0 -1 1 0 -1' bias=100",  // a sum of 0 divides by 1; not mirrored
       [](const Channel& at, int32_t x, int32_t y) {
         double sum = 100;
         for (int32_t i = -1; i <= 1; ++i) sum += at(x - 1, y + i) - at(x + 1, y + i);
         return sum;
       },
       0},
      {"edges 0.5", [](const Channel& at, int32_t x, int32_t y) { return 0.5 * std::hypot(Slope(at, x, y, true), Slope(at, x, y, false)); }, 0},
      {"emboss 90 2", [](const Channel& at, int32_t x, int32_t y) { return 127.5 - 2 * Slope(at, x, y, true) / 8; }, 0},
      {"emboss 0 4", [](const Channel& at, int32_t x, int32_t y) { return 127.5 + 4 * Slope(at, x, y, false) / 8; }, 0},
      {"motion-blur 7", [](const Channel& at, int32_t x, int32_t y) { return MeanAlong(at, x, y, 1, 0, 3); }, 1},
      {"motion-blur 5 90", [](const Channel& at, int32_t x, int32_t y) { return MeanAlong(at, x, y, 0, 1, 2); }, 1},
      {"despeckle threshold=0", Median3, 0},
      {"mosaic 4",
       [](const Channel& at, int32_t x, int32_t y) {
         double sum = 0, count = 0;
         for (int32_t j = y / 4 * 4; j < std::min(y / 4 * 4 + 4, kHeight); ++j) {
           for (int32_t i = x / 4 * 4; i < std::min(x / 4 * 4 + 4, kWidth); ++i, ++count)
             sum += at(i, j);
         }
         return sum / count;
       },
       0},
      {"mosaic 500 3x2+5+6",
       [](const Channel& at, int32_t x, int32_t y) {
         if (x < 5 || x > 7 || y < 6 || y > 7) return static_cast<double>(at(x, y));
         double sum = 0;
         for (int32_t i = 0; i < 6; ++i) sum += at(5 + i % 3, 6 + i / 3);
         return sum / 6;
       },
       0},
      {"surface-blur 2 30",
       [](const Channel& at, int32_t x, int32_t y) {
         double sum = 0, count = 0;
         for (int32_t i = 0; i < 25; ++i) {
           const int32_t level = at(x + i % 5 - 2, y + i / 5 - 2),
                         weight = std::max(0, 31 - std::abs(level - at(x, y)));
           sum += weight * level;
           count += weight;
         }
         return sum / count;
       },
       0},
      {"radial-blur spin 0", [](const Channel& at, int32_t x, int32_t y) { return static_cast<double>(at(x, y)); }, 0},
      {"spread 0", [](const Channel& at, int32_t x, int32_t y) { return static_cast<double>(at(x, y)); }, 0},
      {"noise uniform 0", [](const Channel& at, int32_t x, int32_t y) { return static_cast<double>(at(x, y)); }, 0},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.line);
    const PicturePointer picture = Source(), source = Source();
    ASSERT_EQ(Apply(*picture, row.line), Status::Ok);
    for (int32_t y = 0; y < kHeight; ++y) {
      for (int32_t x = 0; x < kWidth; ++x) {
        for (const int shift : {0, 8, 16}) {
          ASSERT_NEAR(Channel(*picture, shift)(x, y), Clamped(row.of(Channel(*source, shift), x, y)), row.tolerance) << x << ", " << y;
        }
      }
    }
  }
}

TEST(Filters, OilUsesTheMostFrequentRange) {
  const PicturePointer picture = Source(), source = Source();
  ASSERT_EQ(Apply(*picture, "oil 2 levels=8"), Status::Ok);
  const Channel blue{*source, 0}, green{*source, 8}, red{*source, 16};
  for (int32_t y = 0; y < kHeight; ++y) {
    for (int32_t x = 0; x < kWidth; ++x) {
      struct Sum {
        int32_t count = 0, green = 0;
      };
      std::map<int32_t, Sum> ranges;
      for (int32_t i = 0; i < 25; ++i) {
        const int32_t u = x + i % 5 - 2, v = y + i / 5 - 2;
        Sum& sum = ranges[static_cast<int32_t>(0.299 * red(u, v) + 0.587 * green(u, v) +
                                               0.114 * blue(u, v) + 0.5) /
                          32];
        ++sum.count;
        sum.green += green(u, v);
      }
      const Sum* most = nullptr;
      for (const auto& [range, sum] : ranges) {
        if (most == nullptr || sum.count > most->count) most = &sum;
      }
      ASSERT_EQ(Channel(*picture, 8)(x, y), Clamped(static_cast<double>(most->green) / most->count)) << x << ", " << y;
    }
  }
}

struct Spread {
  double mean = 0, deviation = 0, changed = 0;
};
Spread NoiseOf(const char* line) {
  const PicturePointer picture = MakePicture(300, 200, [](int32_t, int32_t) { return 0x808080u; });
  EXPECT_EQ(Apply(*picture, line), Status::Ok);
  Spread spread;
  double squares = 0;
  for (const uint32_t color : Colors(*picture)) {
    const double by = static_cast<double>(color >> 8 & 255) - 128;
    spread.mean += by / 60000;
    squares += by * by / 60000;
    spread.changed += color != 0x808080 ? 1.0 / 60000 : 0;
  }
  spread.deviation = std::sqrt(squares);
  return spread;
}

TEST(Filters, NoiseHasItsDistribution) {
  EXPECT_NEAR(NoiseOf("noise gaussian 10%").deviation, 25.5, 0.4);
  EXPECT_NEAR(NoiseOf("noise gaussian 10%").mean, 0, 0.4);
  EXPECT_NEAR(NoiseOf("noise uniform 20%").deviation, 51 / std::sqrt(3), 0.4);
  EXPECT_NEAR(NoiseOf("noise uniform 20%").mean, 0, 0.4);
  EXPECT_NEAR(NoiseOf("noise salt-pepper 12%").changed, 0.12, 0.005);
  EXPECT_NEAR(NoiseOf("noise salt-pepper 100%").deviation, 127.5, 0.6);
  const auto colors = [](const char* line) {
    const PicturePointer picture = Source();
    EXPECT_EQ(Apply(*picture, line), Status::Ok);
    return Colors(*picture);
  };
  EXPECT_EQ(colors("noise seed=1"), colors("noise"));
  EXPECT_NE(colors("noise seed=2"), colors("noise"));
  EXPECT_NE(colors("spread seed=2"), colors("spread"));
  const PicturePointer gray = MakePicture(20, 20, [](int32_t, int32_t) { return 0x808080u; });
  ASSERT_EQ(Apply(*gray, "noise gray"), Status::Ok);
  for (const uint32_t color : Colors(*gray)) EXPECT_EQ(color, (color & 255) * 0x010101);
}

TEST(Filters, RemoveRedEyeWithinTheAreaOnly) {
  const auto make = [] {
    return MakePicture(6, 4, [](int32_t x, int32_t) { return x % 2 == 0 ? 0xd02030u : 0x806050u; });
  };
  const PicturePointer picture = make();
  ASSERT_EQ(Apply(*picture, "red-eye 3x2+1+1"), Status::Ok);
  const PicturePointer source = make();
  for (int32_t y = 0; y < 4; ++y) {
    for (int32_t x = 0; x < 6; ++x) {
      const bool healed = x == 2 && (y == 1 || y == 2);
      EXPECT_EQ(ColorAt(*picture, x, y), healed ? 0x282030u : ColorAt(*source, x, y)) << x << ", " << y;
    }
  }
}

TEST(Filters, RemoveRedFromPupilsOnlyWithinAFace) {
  const auto color = [](int32_t x, int32_t y) {
    const bool inSpot = x >= 25 && x < 33 && ((y >= 35 && y < 43) || (y >= 80 && y < 88));
    const bool inStrip = y >= 20 && y < 24;  // wider than an eye
    return inSpot || inStrip ? 0xd02030u : 0xd08068u;
  };
  const PicturePointer picture = MakePicture(100, 100, color);
  const Rectangle face{0, 0, 100, 100};
  ASSERT_EQ(RemoveRedEyesOfFace(*picture, face, face, 2.2), Status::Ok);
  for (int32_t y = 0; y < 100; ++y) {
    for (int32_t x = 0; x < 100; ++x) {
      const bool healed = x >= 25 && x < 33 && y >= 35 && y < 43;
      EXPECT_EQ(ColorAt(*picture, x, y), healed ? 0x282030u : color(x, y)) << x << ", " << y;
    }
  }
}

// The colors of transparent pixels must not bleed.
TEST(Filters, WeightColorsByAlpha) {
  for (const char* line : {"motion-blur 5 20", "radial-blur zoom 60", "radial-blur spin 40",
                           "surface-blur 3 255", "oil 2", "mosaic 7", "kernel '1 1 1 1 1 1 1 1 1'",
                           "despeckle threshold=0", "rotate 20 background=#00000000", "swirl 90"}) {
    SCOPED_TRACE(line);
    const auto isSeen = [](int32_t x) { return x < 10; };
    const PicturePointer picture =
        MakePicture(20, 8, [&](int32_t x, int32_t) { return isSeen(x) ? 0x306090u : 0xffffffu; });
    AddAlpha(*picture, [&](int32_t x, int32_t) { return isSeen(x) ? 200 : 0; });
    ASSERT_EQ(Apply(*picture, line), Status::Ok);
    for (int32_t y = 0; y < picture->image.Height(); ++y) {
      for (int32_t x = 0; x < picture->image.Width(); ++x) {
        if (picture->alpha.PixelAt(x, y) == 0) continue;
        for (const int shift : {0, 8, 16}) {
          EXPECT_NEAR(static_cast<double>(ColorAt(*picture, x, y) >> shift & 255), 0x306090 >> shift & 255, 1) << x << ", " << y;
        }
      }
    }
  }
}

TEST(Filters, KernelsAreChecked) {
  const struct {
    const char *line, *parameter;
  } rows[] = {{"kernel '1 2 3'", "weights"},
              {"kernel '1 1 1 1 x 1 1 1 1'", "weights"},
              {"kernel '1 1 1 1 nan 1 1 1 1'", "weights"},
              {"kernel ''", "weights"},
              {"kernel '1,1,1 1,1,1 1,1,1' divisor=0", "divisor"}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.line);
    Recipe recipe;
    const auto mistakes = ReadRecipe(row.line, {}, recipe);
    ASSERT_EQ(mistakes.size(), 1u);
    EXPECT_EQ(mistakes[0].parameter, row.parameter);
  }
}

}  // namespace
}  // namespace fotomill::test
