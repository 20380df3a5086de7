#include <gtest/gtest.h>

#include <cmath>

#include "operations/engine.h"
#include "processing/pictures.h"

// Expected values are computed from the formulas in docs/user/effects.md, for a grid of colors.
namespace fotomill::test {
namespace {

struct Rgb {
  double red, green, blue;
};
using Formula = std::function<Rgb(const Rgb&)>;

constexpr int32_t kSteps = 18;  // a channel takes every 15th level

uint32_t GridColor(int32_t x, int32_t y) {
  const auto level = [](int32_t step) { return static_cast<uint32_t>(step * 15); };
  return level(x % kSteps) << 16 | level(x / kSteps) << 8 | level(y);
}
PicturePointer Grid() { return MakePicture(kSteps * kSteps, kSteps, GridColor); }

Status Apply(const std::string& text, PictureRecord& picture) {
  Recipe recipe;
  for (const Mistake& mistake : ReadRecipe(text, {}, recipe))
    ADD_FAILURE() << text << ": " << mistake.Text();
  return ApplySteps(picture, recipe.common, {});
}

Formula Each(const std::function<double(double)>& value) {
  return [=](const Rgb& c) { return Rgb{value(c.red), value(c.green), value(c.blue)}; };
}

// In thousandths, so that sums are exact.
double Luma1000(const Rgb& c) { return 299 * c.red + 587 * c.green + 114 * c.blue; }
Rgb Gray(double v) { return {v, v, v}; }

// Rounded to nearest, ties up, then clamped. Sums that are ties in decimal may be slightly
// lower in binary.
uint32_t Level(double v) {
  return static_cast<uint32_t>(std::clamp(std::floor(v + 0.5 + 1e-9), 0.0, 255.0));
}

struct Row {
  const char* text;
  Formula formula;
};

TEST(Effects, FollowTheirFormulas) {
  const Row rows[] = {
      {"brightness 10", Each([](double v) { return v + 25.5; })},
      {"brightness -33", Each([](double v) { return v - 255 * 33 / 100.0; })},
      {"contrast 30",
       Each([](double v) { return (v - 127.5) * std::tan(130 * M_PI / 400) + 127.5; })},
      {"contrast -100", Each([](double) { return 127.5; })},
      {"contrast 100", Each([](double v) { return v < 127.5 ? 0 : 255; })},
      {"gamma 2.2", Each([](double v) { return 255 * std::pow(v / 255, 1 / 2.2); })},
      {"levels 20 220",
       Each([](double v) { return 255 * (std::clamp(v, 20.0, 220.0) - 20) / 200; })},
      {"levels 20 220 2 out-black=200 out-white=50", Each([](double v) {
         return 200 - 150 * std::sqrt((std::clamp(v, 20.0, 220.0) - 20) / 200);
       })},
      {"curves \"0,0 255,255\"", Each([](double v) { return v; })},
      {"curves \"0,255 255,0\"", Each([](double v) { return 255 - v; })},
      {"curves \"30,10 60,70\" red",
       [](const Rgb& c) {
         return Rgb{c.red <= 30 ? 10 : c.red >= 60 ? 70 : 10 + 2 * (c.red - 30), c.green, c.blue};
       }},
      {"invert", Each([](double v) { return 255 - v; })},
      {"posterize 4", Each([](double v) { return std::floor(v * 3 / 255 + 0.5) * 85; })},
      {"posterize 256", Each([](double v) { return v; })},
      {"solarize 120", Each([](double v) { return v >= 120 ? 255 - v : v; })},
      {"temperature 40",
       [](const Rgb& c) {
         return Rgb{c.red * 1.1, c.green, c.blue * 0.9};
       }},
      {"tint #ff8000 29%",
       [](const Rgb& c) {
         const auto mixed = [](double v, double to) { return v + (to - v) * 29 / 100; };
         return Rgb{mixed(c.red, 255), mixed(c.green, 128), mixed(c.blue, 0)};
       }},
      {"gray", [](const Rgb& c) { return Gray(Luma1000(c) / 1000); }},
      {"threshold 90", [](const Rgb& c) { return Gray(Luma1000(c) >= 90000 ? 255 : 0); }},
      {"threshold 0", [](const Rgb&) { return Gray(255); }},
      {"saturation 0", [](const Rgb& c) { return Gray(Luma1000(c) / 1000); }},
      {"saturation 150",
       [](const Rgb& c) {
         const auto spread = [&](double v) {
           return (Luma1000(c) + (1000 * v - Luma1000(c)) * 1.5) / 1000;
         };
         return Rgb{spread(c.red), spread(c.green), spread(c.blue)};
       }},
      {"saturation 400%",
       [](const Rgb& c) {
         const auto spread = [&](double v) {
           return (Luma1000(c) + (1000 * v - Luma1000(c)) * 4) / 1000;
         };
         return Rgb{spread(c.red), spread(c.green), spread(c.blue)};
       }},
      {"sepia",
       [](const Rgb& c) {
         return Rgb{(393 * c.red + 769 * c.green + 189 * c.blue) / 1000,
                    (349 * c.red + 686 * c.green + 168 * c.blue) / 1000,
                    (272 * c.red + 534 * c.green + 131 * c.blue) / 1000};
       }},
      {"sepia 0", Each([](double v) { return v; })},
      {"colorize #4080c0",
       [](const Rgb& c) {
         const double v = std::floor(Luma1000(c) / 1000 + 0.5);
         const auto shade = [v](double color) {
           return v <= 127.5 ? color * v / 127.5 : color + (255 - color) * (v - 127.5) / 127.5;
         };
         return Rgb{shade(0x40), shade(0x80), shade(0xc0)};
       }},
      {"channels keep=green", [](const Rgb& c) { return Gray(c.green); }},
      {"channels swap=red-blue",
       [](const Rgb& c) {
         return Rgb{c.blue, c.green, c.red};
       }},
      {"channels mix=\"50 50 0, 0 100 0, -100 0 200\"",
       [](const Rgb& c) {
         return Rgb{(c.red + c.green) / 2, c.green, 2 * c.blue - c.red};
       }},
      {"hue 120",
       [](const Rgb& c) {
         return Rgb{c.blue, c.red, c.green};
       }},
      {"hue -120",
       [](const Rgb& c) {
         return Rgb{c.green, c.blue, c.red};
       }},
      {"hue 360", Each([](double v) { return v; })},
      {"hue 180",  // distances from the minimum and the maximum are exchanged
       [](const Rgb& c) {
         const double sum = std::max({c.red, c.green, c.blue}) + std::min({c.red, c.green, c.blue});
         return Rgb{sum - c.red, sum - c.green, sum - c.blue};
       }},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.text);
    const PicturePointer picture = Grid();
    ASSERT_EQ(Apply(row.text, *picture), Status::Ok);
    int32_t wrong = 0;
    for (int32_t y = 0; y < kSteps && wrong < 5; ++y) {
      for (int32_t x = 0; x < kSteps * kSteps && wrong < 5; ++x) {
        const uint32_t old = GridColor(x, y);
        const Rgb made =
            row.formula({static_cast<double>(old >> 16), static_cast<double>(old >> 8 & 255),
                         static_cast<double>(old & 255)});
        const uint32_t expected = Level(made.red) << 16 | Level(made.green) << 8 | Level(made.blue);
        if (ColorAt(*picture, x, y) == expected) continue;
        ++wrong;
        ADD_FAILURE() << std::hex << old << " became " << ColorAt(*picture, x, y) << ", not " << expected;
      }
    }
  }
}

TEST(Effects, StretchLevelsByHistogram) {
  struct Case {
    const char* text;
    std::vector<int32_t> before, after;  // a row of grays
  };
  const Case cases[] = {
      {"auto-levels 0", {50, 100, 150}, {0, 128, 255}},
      {"auto-levels 0", {70, 70}, {70, 70}},
      {"auto-levels 25", {0, 50, 60, 255}, {0, 0, 255, 255}},
      {"equalize", {10, 10, 20, 30, 30}, {0, 0, 170, 255, 255}},
      {"equalize", {9, 9}, {9, 9}},
  };
  for (const Case& row : cases) {
    SCOPED_TRACE(row.text);
    const PicturePointer picture =
        MakePicture(static_cast<int32_t>(row.before.size()), 1, [&](int32_t x, int32_t) {
          return static_cast<uint32_t>(row.before[static_cast<size_t>(x)]) * 0x010101u;
        });
    ASSERT_EQ(Apply(row.text, *picture), Status::Ok);
    for (size_t x = 0; x < row.after.size(); ++x) {
      EXPECT_EQ(ColorAt(*picture, static_cast<int32_t>(x), 0) & 255, static_cast<uint32_t>(row.after[x])) << x;
    }
  }
  // A common histogram for all channels keeps grays gray; separate ones do not.
  const auto makePair = [] {
    return MakePicture(2, 1, [](int32_t x, int32_t) { return x == 0 ? 0x204060u : 0x808080u; });
  };
  const PicturePointer together = makePair(), each = makePair();
  ASSERT_EQ(Apply("auto-levels 0 together", *together), Status::Ok);
  ASSERT_EQ(Apply("auto-levels 0", *each), Status::Ok);
  EXPECT_EQ(Colors(*together), (std::vector<uint32_t>{0x0055aa, 0xffffff}));
  EXPECT_EQ(Colors(*each), (std::vector<uint32_t>{0x000000, 0xffffff}));
}

TEST(Effects, LeaveAlphaAloneExceptChannels) {
  const auto make = [] {
    PicturePointer picture = Grid();
    AddAlpha(*picture, [](int32_t x, int32_t) { return x % 256; });
    return picture;
  };
  const PicturePointer changed = make(), shown = make(), opaque = Grid();
  ASSERT_EQ(Apply("sepia; auto-levels; vignette; channels swap=red-blue", *changed), Status::Ok);
  ASSERT_FALSE(changed->alpha.Empty());
  EXPECT_EQ(changed->alpha.Row(3)[77], 77);
  ASSERT_EQ(Apply("channels keep=alpha", *shown), Status::Ok);
  EXPECT_TRUE(shown->alpha.Empty());
  EXPECT_EQ(ColorAt(*shown, 77, 3), 0x4d4d4du);
  ASSERT_EQ(Apply("channels keep=alpha", *opaque), Status::Ok);
  EXPECT_EQ(ColorAt(*opaque, 77, 3), 0xffffffu);
}

TEST(Effects, VignetteDarkensCornersAndKeepsTheCenter) {
  const PicturePointer picture = MakePicture(101, 61, [](int32_t, int32_t) { return 0xc8c8c8u; });
  ASSERT_EQ(Apply("vignette 50 40 #ff0000", *picture), Status::Ok);
  EXPECT_EQ(ColorAt(*picture, 50, 30), 0xc8c8c8u);
  EXPECT_EQ(ColorAt(*picture, 65, 30), 0xc8c8c8u);
  const uint32_t corner = ColorAt(*picture, 0, 0);
  EXPECT_EQ(corner, ColorAt(*picture, 100, 60));
  EXPECT_EQ(corner, ColorAt(*picture, 0, 60));
  EXPECT_NEAR(corner >> 16, 227, 2);  // halfway to red, minus the half pixel to the corner
  EXPECT_NEAR(corner & 255, 100, 2);
  // the middle of the left edge
  const double r = std::sqrt(std::pow(50 / 50.5, 2) / 2), s = (r - 0.4) / 0.6;
  EXPECT_EQ(ColorAt(*picture, 0, 30) & 255, static_cast<uint32_t>(200 - 100 * s * s * (3 - 2 * s) + 0.5));
}

TEST(Effects, RejectInvalidParameters) {
  for (const char* text :
       {"levels 200 100", "tint #ff000080", "channels", "channels keep=red swap=red-blue",
        "channels mix=\"1 2\"", "channels mix=\"1 2 3 4 5 6 7 8 nan\"",
        "channels mix=\"1 2 3 4 5 6 7 8 201\"", "posterize 1", "saturation -1"}) {
    SCOPED_TRACE(text);
    Recipe recipe;
    EXPECT_EQ(ReadRecipe(text, {}, recipe).size(), 1u);
  }
}

}  // namespace
}  // namespace fotomill::test
