#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <numbers>

#include "drawing/shape_mask.h"
#include "drawing/text_block.h"
#include "processing/geometry/scale.h"

// DejaVu Sans is in the project's package list, so its glyphs can be relied on.
namespace fotomill::test {
namespace {

constexpr const char* kFont = "DejaVu Sans";

std::vector<uint32_t> Glyphs(TextFont& font, std::string_view text) {
  std::vector<uint32_t> glyphs;
  for (const PlacedGlyph& glyph : font.Shape(text).glyphs) glyphs.push_back(glyph.glyph);
  return glyphs;
}

std::vector<uint32_t> Joined(std::vector<std::vector<uint32_t>> parts) {
  std::vector<uint32_t> all;
  for (const auto& part : parts) all.insert(all.end(), part.begin(), part.end());
  return all;
}

// The nonempty part of a mask, and its total coverage in pixels.
struct Ink {
  Rectangle bounds;
  double pixels = 0;
};
Ink InkOf(const PackedImage& mask) {
  int32_t left = mask.Width(), right = 0, top = mask.Height(), bottom = 0;
  Ink ink;
  for (int32_t y = 0; y < mask.Height(); ++y) {
    for (int32_t x = 0; x < mask.Width(); ++x) {
      const int32_t cover = mask.Row(y)[static_cast<size_t>(x)];
      ink.pixels += cover / 255.0;
      if (cover == 0) continue;
      left = std::min(left, x), right = std::max(right, x + 1);
      top = std::min(top, y), bottom = std::max(bottom, y + 1);
    }
  }
  if (right > left) ink.bounds = {left, top, right - left, bottom - top};
  return ink;
}

Ink Drawn(TextFont& font, std::string_view text, const LinePlace& place, Size size) {
  PackedImage mask;
  EXPECT_EQ(NewAlphaPlane(size.width, size.height, mask), Status::Ok);
  EXPECT_EQ(font.Draw(font.Shape(text), place, mask), Status::Ok);
  return InkOf(mask);
}

TEST(TextShaping, OrdersRightToLeftRuns) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 40), Status::Ok);
  const auto alef = Glyphs(font, "א"), bet = Glyphs(font, "ב"), blank = Glyphs(font, " "),
             one = Glyphs(font, "1"), two = Glyphs(font, "2"), a = Glyphs(font, "a"),
             open = Glyphs(font, "("), close = Glyphs(font, ")");
  EXPECT_EQ(Glyphs(font, "אב"), Joined({bet, alef}));
  EXPECT_EQ(Glyphs(font, "אב 12"), Joined({one, two, blank, bet, alef})) << "numbers keep theirs";
  EXPECT_EQ(Glyphs(font, "a אב a"), Joined({a, blank, bet, alef, blank, a}));
  EXPECT_EQ(Glyphs(font, "(א)"), Joined({open, alef, close})) << "brackets are mirrored";
  const TextLine line = font.Shape("אב 12");
  for (size_t i = 1; i < line.glyphs.size(); ++i)
    EXPECT_GE(line.glyphs[i].x, line.glyphs[i - 1].x);
}

TEST(TextShaping, JoinsStacksAndFallsBack) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 40), Status::Ok);
  EXPECT_NE(Glyphs(font, "بب"), Joined({Glyphs(font, "ب"), Glyphs(font, "ب")}));
  EXPECT_EQ(font.WidthOf("e\u0301"), font.WidthOf("\u00e9"));
  EXPECT_EQ(font.WidthOf("x\u0303"), font.WidthOf("x")) << "a mark takes no room";
  EXPECT_EQ(font.Shape("abc", 5).width, font.Shape("abc").width + 3 * 5 * 64);
  EXPECT_EQ(Glyphs(font, "a\tb"), Glyphs(font, "a b"));
  EXPECT_EQ(Glyphs(font, "\xff"), Glyphs(font, "\uFFFD"));
  EXPECT_EQ(Glyphs(font, "\x01"), Glyphs(font, "\uFFFD"));
  EXPECT_EQ(font.Shape("").width, 0);
  // A fallback glyph keeps the size, and the surrounding letters their font.
  TextFont mono;
  ASSERT_EQ(mono.Open("DejaVu Sans Mono", 40), Status::Ok);
  const TextLine mixed = mono.Shape("aאa");
  ASSERT_EQ(mixed.glyphs.size(), 3u);
  EXPECT_EQ(mixed.glyphs[0].face, mixed.glyphs[2].face);
}

TEST(TextShaping, ShowsABoxForMissingCharacters) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 40), Status::Ok);
  const TextLine line = font.Shape("a\U0010FFFDb");
  ASSERT_EQ(line.glyphs.size(), 3u);
  EXPECT_EQ(line.glyphs[1].face, PlacedGlyph::kBox);
  EXPECT_EQ(line.width, font.Shape("a").width + font.Shape("b").width + 24 * 64);
  const Ink box = Drawn(font, "\U0010FFFD", {10, 50}, {60, 60});
  EXPECT_EQ(box.bounds, (Rectangle{12, 22, 20, 28})) << "half an em wide, 7/10 high";
  EXPECT_NEAR(box.pixels, 20 * 28 - 16 * 24, 1) << "its inside is empty";
}

TEST(TextFont, NamesWeightAndSlant) {
  TextFont regular, bold, unknown;
  ASSERT_EQ(regular.Open(kFont, 40), Status::Ok);
  ASSERT_EQ(bold.Open("DejaVu Sans Bold", 40), Status::Ok);
  ASSERT_EQ(unknown.Open("No Such Family", 40), Status::Ok);
  EXPECT_GT(bold.WidthOf("minimum"), regular.WidthOf("minimum"));
  EXPECT_GT(unknown.WidthOf("minimum"), 0);
  TextFont line;
  ASSERT_EQ(line.OpenForLine(kFont, 14), Status::Ok);
  EXPECT_NEAR(line.LineHeight(), 14, 0.01);
}

TEST(TextMask, RotatesStrokesAndClips) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 40), Status::Ok);
  const Ink flat = Drawn(font, "HE", {50, 100}, {200, 200});
  EXPECT_NEAR(flat.bounds.y + flat.bounds.height, 100, 1);
  EXPECT_NEAR(flat.bounds.height, 29, 1) << "capitals of this font are 0.73 em high";
  const Ink turned = Drawn(font, "HE", {50, 100, 90}, {200, 200});
  EXPECT_NEAR(turned.bounds.x, 50, 1) << "clockwise: what was above the baseline is to its right";
  EXPECT_NEAR(turned.bounds.width, flat.bounds.height, 2);
  EXPECT_NEAR(turned.bounds.height, flat.bounds.width, 2);
  EXPECT_NEAR(turned.pixels, flat.pixels, flat.pixels / 25);
  const Ink edges = Drawn(font, "HE", {50, 100, 0, 4}, {200, 200});
  EXPECT_NEAR(edges.bounds.width, flat.bounds.width + 8, 2);
  EXPECT_NEAR(edges.bounds.height, flat.bounds.height + 8, 2);
  EXPECT_GT(edges.pixels, flat.pixels);
  for (const auto& [x, y] :
       {std::pair{-20.0, 10.0}, {190.0, 100.0}, {50.0, 210.0}, {50.0, -1e6}, {1e8, 1e8}}) {
    const Ink cut = Drawn(font, "HE", {x, y}, {200, 200});
    EXPECT_LT(cut.pixels, flat.pixels) << x << " " << y;
  }
}

TEST(TextBlock, BreaksLines) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 20), Status::Ok);
  const double five = font.Shape("aaaaa").width / 64.0 + 1;
  const struct {
    const char* text;
    double width;
    std::vector<const char*> lines;
  } rows[] = {
      {"aa aa aa", 0, {"aa aa aa"}},
      {"aa aa aa", five, {"aa aa", "aa"}},
      {"aa\naa", five, {"aa", "aa"}},
      {"a\n\nb", 0, {"a", "", "b"}},
      {"aaaaaaa a", five, {"aaaaa", "aa a"}},
      {"aa      aaa", five, {"aa", "aaa"}},
      {"漢漢漢漢漢", font.Shape("漢漢").width / 64.0 + 1, {"漢漢", "漢漢", "漢"}},
      {"aaa", 1, {"a", "a", "a"}},
      {"", 10, {""}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.text);
    const TextBlock block = LayOutText(font, row.text, {.width = row.width});
    ASSERT_EQ(block.lines.size(), row.lines.size());
    for (size_t i = 0; i < row.lines.size(); ++i)
      EXPECT_EQ(block.lines[i].width, font.Shape(row.lines[i]).width) << i;
  }
  const TextBlock one = LayOutText(font, "x", {}),
                  two = LayOutText(font, "x\nx", {.lineSpacing = 7});
  EXPECT_EQ(two.height, one.height + one.step + 7);
}

TEST(TextBlock, KeepsTheDirectionOfAParagraph) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 20), Status::Ok);
  const auto alef = Glyphs(font, "א"), bet = Glyphs(font, "ב"), blank = Glyphs(font, " "),
             a = Glyphs(font, "a"), stop = Glyphs(font, ".");
  const double width = font.Shape("a אבא.").width / 64.0 + 1;
  const struct {
    const char* name;
    const char* text;
    std::vector<std::vector<uint32_t>> lines;
  } rows[] = {
      {"a line that begins with a Latin word",
       "אבאבא a אב.",
       {Joined({alef, bet, alef, bet, alef}), Joined({stop, bet, alef, blank, a})}},
      {"Hebrew within Latin",
       "aaaaa אב a.",
       {Joined({a, a, a, a, a}), Joined({bet, alef, blank, a, stop})}},
      {"each paragraph for itself",
       "אב a\na אב",
       {Joined({a, blank, bet, alef}), Joined({a, blank, bet, alef})}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const TextBlock block = LayOutText(font, row.text, {.width = width});
    ASSERT_EQ(block.lines.size(), row.lines.size());
    for (size_t i = 0; i < row.lines.size(); ++i) {
      std::vector<uint32_t> glyphs;
      for (const PlacedGlyph& glyph : block.lines[i].glyphs) glyphs.push_back(glyph.glyph);
      EXPECT_EQ(glyphs, row.lines[i]) << i;
    }
  }
}

TEST(TextBlock, StopsBetweenLetters) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 20), Status::Ok);
  PackedImage mask;
  ASSERT_EQ(NewAlphaPlane(200, 25, mask), Status::Ok);
  int left = 5;  // letters
  const Work work{.goesOn = [&] { return left-- > 0; }};
  EXPECT_EQ(DrawTextBlock(font, LayOutText(font, "HHHHHHHH", {}), {100, 12, 0, 0}, mask, work),
            Status::FunctionCancelled);
  EXPECT_EQ(left, -1);
  EXPECT_EQ(DrawShape({100, 12, 50, 10}, mask, work), Status::FunctionCancelled);
}

TEST(TextBlock, AlignsLines) {
  TextFont font;
  ASSERT_EQ(font.Open(kFont, 20), Status::Ok);
  for (const TextAlign align : {TextAlign::Left, TextAlign::Center, TextAlign::Right}) {
    const TextBlock block = LayOutText(font, "HHHHHHHH\nH", {.align = align});
    PackedImage mask;
    ASSERT_EQ(NewAlphaPlane(200, 25, mask), Status::Ok);  // the first line's upper half is clipped
    ASSERT_EQ(DrawTextBlock(font, block, {100, 0, 0, 0}, mask), Status::Ok);
    const Ink last = InkOf(mask);
    const double left = 100 - block.width / 2, room = block.width - block.lines[1].width / 64.0;
    const double expected = left + room * static_cast<double>(align) / 2 +
                            (block.lines[1].width / 64.0 - last.bounds.width) / 2;
    EXPECT_NEAR(last.bounds.x, expected, 1.5) << static_cast<int>(align);
  }
}

TEST(ShapeMask, CoversShapes) {
  PackedImage mask;
  ASSERT_EQ(NewAlphaPlane(60, 50, mask), Status::Ok);
  ASSERT_EQ(DrawShape({30, 25, 40, 20}, mask), Status::Ok);
  EXPECT_EQ(InkOf(mask).bounds, (Rectangle{10, 15, 40, 20}));
  EXPECT_EQ(InkOf(mask).pixels, 800) << "edges along pixels are sharp";
  ASSERT_EQ(CutShape({30, 25, 36, 16}, mask), Status::Ok);
  EXPECT_EQ(InkOf(mask).pixels, 800 - 36 * 16);
  ASSERT_EQ(NewAlphaPlane(60, 50, mask), Status::Ok);
  ASSERT_EQ(DrawShape({30, 25, 40, 20, 30, 0}, mask), Status::Ok);
  EXPECT_NEAR(InkOf(mask).pixels, 800, 8) << "turned";
  ASSERT_EQ(NewAlphaPlane(60, 50, mask), Status::Ok);
  ASSERT_EQ(DrawShape({30, 25, 40, 20, 0, 8}, mask), Status::Ok);
  EXPECT_NEAR(InkOf(mask).pixels, 800 - (4 - std::numbers::pi) * 64, 2) << "with round corners";
}

}  // namespace
}  // namespace fotomill::test
