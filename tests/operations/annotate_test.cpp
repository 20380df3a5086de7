#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <map>

#include "operations/engine.h"
#include "processing/color/overlay.h"
#include "processing/pictures.h"
#include "registry/registry.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

constexpr uint32_t kSea = 0x204060;

// Keys as in a configuration file.
using Keys = std::map<std::string, std::string>;

Recipe Read(const std::string& text, const Keys& keys = {}) {
  Recipe recipe;
  const auto value = [&](std::string_view key) {
    const auto found = keys.find(std::string(key));
    return found == keys.end() ? std::string() : found->second;
  };
  for (const Mistake& mistake : ReadRecipe(text, value, recipe))
    ADD_FAILURE() << text << ": " << mistake.Text();
  return recipe;
}

PicturePointer Applied(PicturePointer picture, const std::string& text, const Keys& keys = {}) {
  const EngineOptions options{.work = {},
                              .facts = {.fileName = "/x/Beach.jpg", .copyrightHolder = "Ada"}};
  EXPECT_EQ(ApplySteps(*picture, Read(text, keys).common, options), Status::Ok) << text;
  return picture;
}

PicturePointer Plain(int32_t width, int32_t height, uint32_t color = kSea) {
  return MakePicture(width, height, [=](int32_t, int32_t) { return color; });
}

// The bounding box of pixels that differ from a color; width 0 if there are none.
Rectangle Changed(const PictureRecord& picture, uint32_t color = kSea) {
  int32_t left = picture.width, right = 0, top = picture.height, bottom = 0;
  for (int32_t y = 0; y < picture.height; ++y) {
    for (int32_t x = 0; x < picture.width; ++x) {
      if (ColorAt(picture, x, y) == color) continue;
      left = std::min(left, x), right = std::max(right, x + 1);
      top = std::min(top, y), bottom = std::max(bottom, y + 1);
    }
  }
  return right > left ? Rectangle{left, top, right - left, bottom - top} : Rectangle{};
}

std::string MistakeIn(const std::string& text, const Keys& keys = {}) {
  Recipe recipe;
  const auto value = [&](std::string_view key) {
    const auto found = keys.find(std::string(key));
    return found == keys.end() ? std::string() : found->second;
  };
  const auto mistakes = ReadRecipe(text, value, recipe);
  return mistakes.empty() ? std::string() : mistakes[0].Text(false);
}

TEST(Overlay, IsPorterAndDuffsOver) {
  for (const int32_t below : {0, 1, 100, 255}) {
    for (const int32_t above : {0, 1, 77, 254, 255}) {
      PicturePointer picture = Plain(1, 1, 0x0a64f0);
      AddAlpha(*picture, [=](int32_t, int32_t) { return below; });
      ASSERT_EQ(PaintRectangle(*picture, {0, 0, 1, 1}, {200, 30, 90, static_cast<uint8_t>(above)}), Status::Ok);
      const double a = above / 255.0, b = below / 255.0 * (1 - a), whole = a + b;
      EXPECT_NEAR(picture->alpha.Row(0)[0], whole * 255, 0.51) << below << " " << above;
      const double channels[] = {0xf0, 0x64, 0x0a}, ink[] = {200, 30, 90};
      for (size_t c = 0; whole > 0 && c < 3; ++c)
        EXPECT_NEAR(picture->image.Row(0)[c], (ink[c] * a + channels[c] * b) / whole, 0.51);
    }
  }
}

TEST(Caption, AddsAStripWithoutChangingThePicture) {
  for (const bool above : {false, true}) {
    const auto source =
        MakePicture(300, 40, [](int32_t x, int32_t y) { return Scatter(x, y) & 0xffffff; });
    const auto before = Colors(*source);
    const auto picture =
        Applied(MakePicture(300, 40, [](int32_t x, int32_t y) { return Scatter(x, y) & 0xffffff; }),
                std::string("caption Hello size=20px font='DejaVu Sans' padding=6 "
                            "background=#ffffff color=#000000 position=") +
                    (above ? "above" : "below"));
    ASSERT_EQ(picture->width, 300);
    const int32_t strip = picture->height - 40;
    EXPECT_EQ(strip, 24 + 12) << "a line of this font is 1.16 em high";
    const int32_t first = above ? strip : 0;
    for (int32_t y = 0; y < 40; ++y) {
      for (int32_t x = 0; x < 300; ++x)
        ASSERT_EQ(ColorAt(*picture, x, first + y), before[static_cast<size_t>(y * 300 + x)]);
    }
    int32_t dark = 0;
    for (int32_t y = 0; y < strip; ++y) {
      for (int32_t x = 0; x < 300; ++x)
        dark += ColorAt(*picture, x, (above ? 0 : 40) + y) == 0 ? 1 : 0;
    }
    EXPECT_GT(dark, 40);
  }
}

TEST(Caption, TakesItsDefaultsFromTheConfiguration) {
  const Keys keys{{"AnnotateText", "%F %W"},         {"AnnotateFontName", "DejaVu Sans"},
                  {"AnnotatePointSizeFont", "18"},   {"AnnotateForeground", "255"},
                  {"AnnotateBackground", "65280"},   {"AnnotateFrame", "1"},
                  {"AnnotateBorderFrameSize", "3"},  {"AnnotatePadding", "10"},
                  {"AnnotateLinespace", "5"},        {"AnnotateCharspace", "2"}};
  const auto made = Applied(Plain(200, 30), "caption", keys);
  const auto spelled = Applied(Plain(200, 30),
                               "caption 'Beach 200' below 'DejaVu Sans' 24px color=#ff0000 background=#00ff00 frame frame-size=3 "
                               "padding=10 line-spacing=5 char-spacing=2");
  EXPECT_EQ(Colors(*made), Colors(*spelled)) << "18 points are 24 pixels where the picture has no resolution";
  EXPECT_EQ(ColorAt(*made, 2, 32), 0xff0000u) << "the frame";
  EXPECT_EQ(ColorAt(*made, 3, 33), 0x00ff00u);
}

TEST(Caption, IsAligned) {
  const char* kAligns[] = {"left", "center", "right"};
  const double expected[] = {10, 150, 290};  // left edge, center, right edge of the letters
  for (size_t i = 0; i < 3; ++i) {
    const auto picture = Applied(
        Plain(300, 1, 0xffffff),
        std::string("caption HHH size=20px padding=10 color=black background=white align=") +
            kAligns[i]);
    const Rectangle ink = Changed(*picture, 0xffffff);
    EXPECT_NEAR(ink.x + ink.width * static_cast<double>(i) / 2, expected[i], 3) << kAligns[i];
  }
}

TEST(DrawnText, IsPlacedByGravity) {
  const struct {
    const char* gravity;
    double x, y;  // position as a share of the free space
  } rows[] = {{"center", 0.5, 0.5}, {"top", 0.5, 0},       {"bottom", 0.5, 1},
              {"left", 0, 0.5},     {"right", 1, 0.5},     {"top-left", 0, 0},
              {"top-right", 1, 0},  {"bottom-left", 0, 1}, {"bottom-right", 1, 1}};
  for (const auto& row : rows) {
    const auto picture =
        Applied(Plain(200, 100), std::string("text H ") + row.gravity +
                                     " size=20px margin=10 box padding=0 background=white");
    const Rectangle ink = Changed(*picture);
    EXPECT_EQ(ink.x, std::floor(10 + row.x * (200 - 20 - ink.width))) << row.gravity;
    EXPECT_EQ(ink.y, std::floor(10 + row.y * (100 - 20 - ink.height))) << row.gravity;
  }
}

TEST(DrawnText, HasOutlineShadowBoxAndOpacity) {
  const auto area = [](const std::string& more) {
    const Rectangle ink = Changed(
        *Applied(Plain(200, 100), "text HO size=40px font='DejaVu Sans' color=#ffffff " + more));
    return Size{ink.width, ink.height};
  };
  const Size plain = area("");
  EXPECT_NEAR(area("outline=5").width, plain.width + 10, 2);
  EXPECT_NEAR(area("outline=5").height, plain.height + 10, 2);
  EXPECT_GT(area("shadow=8").width, plain.width + 8);
  EXPECT_EQ(area("frame frame-size=2 padding=6").width, area("box padding=8").width);
  EXPECT_EQ(area("opacity=0").width, 0);
  EXPECT_NEAR(area("rotation=90").height, plain.width, 2);
  // Half opaque: halfway between sea and white where letters fully cover pixels.
  const auto half = Applied(Plain(100, 60),
                            "text HHH size=30px color=#ffffff opacity=50 font='DejaVu Sans Bold'");
  const auto colors = Colors(*half);
  const auto brightest = *std::ranges::max_element(colors);
  EXPECT_EQ(brightest, 0x90a0b0u);
}

TEST(DrawnText, KeepsSurroundingTransparency) {
  auto picture = Plain(60, 40);
  AddAlpha(*picture, [](int32_t, int32_t) { return 0; });
  picture = Applied(std::move(picture), "text H size=30px color=#ff0000 font='DejaVu Sans Bold'");
  EXPECT_EQ(picture->alpha.Row(0)[0], 0);
  const auto row = picture->alpha.Row(20);
  const auto most = std::ranges::max_element(row.first(60)) - row.begin();
  EXPECT_EQ(row[static_cast<size_t>(most)], 255);
  EXPECT_EQ(ColorAt(*picture, static_cast<int32_t>(most), 20), 0xff0000u) << "no color of what cannot be seen";
}

class Watermarks : public testing::Test {
 protected:
  // A logo of 20 x 10 pixels: its left half is opaque red, its right half transparent.
  void SetUp() override {
    const auto logo = MakePicture(20, 10, [](int32_t, int32_t) { return 0xff0000u; });
    AddAlpha(*logo, [](int32_t x, int32_t) { return x < 10 ? 255 : 0; });
    ASSERT_EQ(WritePictureAs(*logo, name_, FindFormatByName("x.png"), {}), Status::Ok);
  }
  const TemporaryFolder folder_;
  const std::string name_ = folder_.Path("logo.png");
};

TEST_F(Watermarks, FitAndPositionPictures) {
  const std::string line = "watermark picture='" + name_ + "' opacity=100 ";
  const auto ink = [&](const std::string& more) {
    return Changed(*Applied(Plain(100, 60), line + more));
  };
  EXPECT_EQ(ink("size=20 margin=0 gravity=top-left"), (Rectangle{0, 0, 10, 10}));
  EXPECT_EQ(ink("size=20 margin=5 gravity=bottom-right"), (Rectangle{75, 45, 10, 10}));
  const Rectangle turned = ink("size=20 margin=0 gravity=top-left rotation=90");
  EXPECT_EQ(turned.width, 6);
  EXPECT_NEAR(turned.height, 6, 1) << "12 high, 6 wide: its upper half";
  EXPECT_EQ(Changed(*Applied(Plain(100, 60), "watermark opacity=0 picture='" + name_ + "'")).width, 0);
  const auto half = Applied(Plain(100, 60), "watermark picture='" + name_ +
                                                "' size=20 margin=0 gravity=top-left opacity=50");
  EXPECT_EQ(ColorAt(*half, 5, 5), 0x902030u);
}

TEST_F(Watermarks, RepeatAsTiles) {
  const auto picture = Applied(
      Plain(100, 60), "watermark picture='" + name_ + "' size=20 margin=5 opacity=100 tiled");
  int32_t red = 0;
  for (int32_t y = 0; y < 60; ++y) {
    for (int32_t x = 0; x < 100; ++x) {
      const bool mark = ColorAt(*picture, x, y) == 0xff0000;
      red += mark ? 1 : 0;
      // Tiles are 25 pixels apart horizontally and 15 vertically.
      EXPECT_TRUE(x + 25 >= 100 || mark == (ColorAt(*picture, x + 25, y) == 0xff0000)) << x;
      EXPECT_TRUE(y + 15 >= 60 || mark == (ColorAt(*picture, x, y + 15) == 0xff0000)) << y;
    }
  }
  EXPECT_EQ(red, 40 * 40) << "4 columns of 10 and 4 rows of 10";
}

TEST_F(Watermarks, TextAndPictureAndTheirKeys) {
  const Keys both{
      {"WatermarkText", "%N"}, {"WatermarkFontName", "DejaVu Sans"}, {"WatermarkImagePath", name_}};
  const auto picture = Applied(Plain(100, 60), "watermark opacity=100 size=20", both);
  EXPECT_EQ(ColorAt(*picture, 45, 30), 0xff0000u) << "a configured picture comes before the configured text";
  const auto text = Applied(Plain(100, 60), "watermark Ada opacity=100 size=50", both);
  const auto spelled =
      Applied(Plain(100, 60), "watermark '%N' opacity=100 size=50 font='DejaVu Sans' picture=");
  EXPECT_EQ(Colors(*text), Colors(*spelled)) << "a text that is written down comes first";
  const Rectangle ink = Changed(*text);
  EXPECT_NEAR(ink.width, 50, 4);
  EXPECT_EQ(MistakeIn("watermark hello picture=" + name_), "watermark: \"picture\" cannot be combined with text.");
  EXPECT_THAT(MistakeIn("watermark picture=/no/such.png"), testing::StartsWith("watermark: \"picture\" names a picture that cannot be read"));
  EXPECT_THAT(MistakeIn("text '%Q'"), testing::HasSubstr("unknown macro"));
}

TEST(Matts, HaveTheirParts) {
  const auto picture = Applied(
      Plain(40, 30),
      "matt 20 fill=#808080 bevel=sunken bevel-size=5 intensity=50 inner-border inner-size=2 "
      "inner-color=#ff0000 outer-border outer-size=3 outer-color=#0000ff");
  ASSERT_EQ(picture->width, 40 + 2 * (2 + 20 + 3));
  ASSERT_EQ(picture->height, 30 + 2 * (2 + 20 + 3));
  const struct {
    int32_t x, y;
    uint32_t color;
  } rows[] = {
      {0, 40, 0x0000ff}, {2, 40, 0x0000ff}, {3, 40, 0x808080}, {17, 40, 0x808080},  // outer border, matte
      {18, 40, 0x404040}, {22, 40, 0x404040}, {23, 40, 0xff0000}, {24, 40, 0xff0000}, {25, 40, kSea},
      {40, 18, 0x404040}, {40, 61, 0xc0c0c0}, {67, 40, 0xc0c0c0}, {71, 40, 0xc0c0c0}, {72, 40, 0x808080},
      {18, 18, 0x404040}, {71, 61, 0xc0c0c0},  // corners of the bevel
      {19, 59, 0x404040}, {19, 60, 0xc0c0c0},  // the miter at the bottom left
  };
  for (const auto& row : rows)
    EXPECT_EQ(ColorAt(*picture, row.x, row.y), row.color) << row.x << "," << row.y;
  const auto raised = Applied(Plain(40, 30), "matt 20 fill=#808080 bevel=raised bevel-size=5");
  EXPECT_EQ(ColorAt(*raised, 16, 30), 0xc0c0c0u);
}

TEST(Matts, TakeTheirDefaultsFromTheConfiguration) {
  const TemporaryFolder folder;
  const std::string name = folder.Path("texture.png");
  const auto tile =
      MakePicture(2, 1, [](int32_t x, int32_t) { return x == 0 ? 0x111111u : 0xeeeeeeu; });
  ASSERT_EQ(WritePictureAs(*tile, name, FindFormatByName("x.png"), {}), Status::Ok);
  Keys keys{{"MattSize", "2"},
            {"MattUnits", "1"},
            {"MattFillColor", "255"},
            {"MattBevelType", "2"},
            {"TextureImagePath", name}};
  EXPECT_EQ(Applied(Plain(10, 10), "matt", keys)->width, 10 + 2 * 76) << "2 cm at 96 an inch";
  EXPECT_EQ(Applied(Plain(10, 10), "matt 5px", keys)->width, 20);
  keys["MattUnits"] = "2";
  const auto plain = Applied(Plain(10, 10), "matt", keys);
  EXPECT_EQ(ColorAt(*plain, 0, 0), 0xff0000u) << "the texture is off";
  keys["MattUseTexture"] = "1";
  const auto textured = Applied(Plain(10, 10), "matt", keys);
  EXPECT_EQ(ColorAt(*textured, 0, 0), 0x111111u);
  EXPECT_EQ(ColorAt(*textured, 1, 1), 0xeeeeeeu);
  EXPECT_EQ(ColorAt(*textured, 13, 13), 0xeeeeeeu) << "behind the picture as well";
  EXPECT_EQ(ColorAt(*textured, 5, 5), kSea);
  EXPECT_EQ(MistakeIn("matt textured"), "matt: \"texture\" must name a picture when textured is on.");
}

TEST(Borders, KeepPalettes) {
  auto picture = Plain(4, 4, 0);
  Palette palette{};
  palette[3] = palette[4] = palette[5] = 255;
  ASSERT_EQ(NewPackedImage(4, 4, &palette, 4, picture->image), Status::Ok);
  picture->palette = palette;
  picture->bitsPerPixel = 4;
  picture = Applied(std::move(picture), "border 3 #00ff00");
  EXPECT_EQ(picture->image.Bits(), 4);
  EXPECT_EQ(picture->width, 10);
  EXPECT_EQ(ColorAt(*picture, 2, 2), 0x00ff00u);
  EXPECT_EQ(ColorAt(*picture, 3, 3), 0u);
  EXPECT_EQ(Applied(Plain(200, 100), "border 10%")->width, 220) << "of the shorter edge";
}

TEST(Shadows, AreBehindThePicture) {
  const auto sharp =
      Applied(Plain(20, 20), "shadow 6 4 blur=0 opacity=50 color=black background=white");
  EXPECT_EQ(sharp->width, 26);
  EXPECT_EQ(sharp->height, 24);
  EXPECT_EQ(ColorAt(*sharp, 0, 0), kSea);
  EXPECT_EQ(ColorAt(*sharp, 19, 19), kSea);
  EXPECT_EQ(ColorAt(*sharp, 25, 23), 0x7f7f7fu);
  EXPECT_EQ(ColorAt(*sharp, 25, 3), 0xffffffu);
  const auto soft = Applied(Plain(20, 20), "shadow -6 0 blur=2 background=#00000000");
  EXPECT_EQ(soft->width, 20 + 12) << "three sigmas and the distance, on one side only";
  EXPECT_EQ(soft->height, 20 + 12);
  EXPECT_EQ(soft->alpha.Row(0)[0], 0);
  EXPECT_EQ(soft->alpha.Row(16)[13], 255);
  EXPECT_NEAR(soft->alpha.Row(16)[6], 0.599 * 153, 2) << "a quarter sigma within the shadow's edge";
}

TEST(RoundCorners, AreTransparentOrFilled) {
  const auto open = Applied(Plain(40, 30), "round-corners 10");
  EXPECT_EQ(open->alpha.Row(0)[0], 0);
  EXPECT_EQ(open->alpha.Row(0)[10], 255);
  EXPECT_EQ(open->alpha.Row(29)[39], 0);
  double covered = 0;
  for (int32_t y = 0; y < 30; ++y) {
    for (int32_t x = 0; x < 40; ++x) covered += open->alpha.Row(y)[static_cast<size_t>(x)] / 255.0;
  }
  EXPECT_NEAR(covered, 1200 - (4 - 3.14159) * 100, 2);
  const auto filled = Applied(Plain(40, 30), "round-corners 10 background=#ffffff");
  EXPECT_TRUE(filled->alpha.Empty());
  EXPECT_EQ(ColorAt(*filled, 0, 0), 0xffffffu);
  EXPECT_EQ(ColorAt(*filled, 20, 0), kSea);
  EXPECT_TRUE(Applied(Plain(40, 30), "round-corners 0")->alpha.Empty());
}

}  // namespace
}  // namespace fotomill::test
