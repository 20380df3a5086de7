#include <gtest/gtest.h>

#include <set>

#include "operations/engine.h"
#include "processing/palette/color_table.h"
#include "processing/pictures.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

PicturePointer Sweep() {
  return MakePicture(96, 64, [](int32_t x, int32_t y) {
    return static_cast<uint32_t>(x * 255 / 95 << 16 | y * 255 / 63 << 8 | (x + y));
  });
}

Status Apply(const std::string& text, PictureRecord& picture) {
  Recipe recipe;
  for (const Mistake& mistake : ReadRecipe(text, {}, recipe))
    ADD_FAILURE() << text << ": " << mistake.Text();
  return ApplySteps(picture, recipe.common, {});
}

size_t ColorsUsed(const PictureRecord& picture) {
  const std::vector<uint32_t> all = Colors(picture);
  return std::set(all.begin(), all.end()).size();
}

TEST(Reduce, UsesTheMinimumDepthWithEveryDither) {
  const struct {
    const char* text;
    int32_t bits;
    size_t most;
  } rows[] = {
      {"reduce", 8, 256},          {"reduce 17", 8, 17},           {"reduce 16", 4, 16},         {"reduce 3", 4, 3},
      {"reduce 2", 1, 2},          {"reduce palette=fixed", 8, 256}, {"reduce 20 fixed", 4, 16},   {"reduce 7 fixed", 1, 2},
      {"reduce 5 gray", 4, 5},     {"reduce palette=gray", 8, 256}, {"mono", 1, 2},
  };
  for (const auto& row : rows) {
    for (const char* dither : {"none", "floyd-steinberg", "atkinson", "stucki", "burkes", "sierra",
                               "bayer2", "bayer4", "bayer8"}) {
      for (const char* way : {"yes", "no"}) {
        const std::string text =
            std::string(row.text) + " dither=" + dither + " bidirectional=" + way;
        SCOPED_TRACE(text);
        const PicturePointer picture = Sweep();
        AddAlpha(*picture, [](int32_t x, int32_t) { return 2 * x; });
        ASSERT_EQ(Apply(text, *picture), Status::Ok);
        EXPECT_EQ(picture->image.Bits(), row.bits);
        EXPECT_EQ(picture->bitsPerPixel, row.bits);
        EXPECT_LE(ColorsUsed(*picture), row.most);
        ASSERT_FALSE(picture->alpha.Empty());
        EXPECT_EQ(picture->alpha.Row(5)[40], 80);
      }
    }
  }
}

// Dithering preserves the mean of an area if the palette includes black and white. Atkinson drops
// errors, so it does not.
TEST(Reduce, DithersPreserveTheMean) {
  for (const char* reduce : {"mono", "reduce 2 fixed", "reduce 4 gray"}) {
    for (const char* dither :
         {"floyd-steinberg", "stucki", "burkes", "sierra", "bayer4", "bayer8"}) {
      for (const int32_t level : {20, 77, 128, 200, 240}) {
        const std::string text = std::string(reduce) + " dither=" + dither;
        SCOPED_TRACE(text + ", level " + std::to_string(level));
        const PicturePointer picture = MakePicture(
            128, 128, [=](int32_t, int32_t) { return static_cast<uint32_t>(level) * 0x010101u; });
        ASSERT_EQ(Apply(text, *picture), Status::Ok);
        double sum = 0;
        for (const uint32_t color : Colors(*picture)) sum += color & 255;
        EXPECT_NEAR(sum / (128 * 128), level, std::string(dither) == "bayer4" ? 9 : 3);
      }
    }
  }
}

// Computed by hand: the error of the first pixel, 100, is diffused according to each kernel.
TEST(Reduce, DiffusesErrorsByTheirKernels) {
  const struct {
    const char* dither;
    // of the pixel after a gray of 100: white with the diffused error, black just below
    int32_t level;
  } rows[] = {{"floyd-steinberg", 128 - 44},
              {"atkinson", 128 - 13},
              {"stucki", 128 - 19},
              {"burkes", 128 - 25},
              {"sierra", 128 - 16}};
  for (const auto& row : rows) {
    for (const int32_t below : {0, 1}) {
      SCOPED_TRACE(row.dither + std::string(" less ") + std::to_string(below));
      const PicturePointer picture = MakePicture(4, 1, [&](int32_t x, int32_t) {
        return static_cast<uint32_t>(x == 0 ? 100 : x == 1 ? row.level - below : 0) * 0x010101u;
      });
      ASSERT_EQ(Apply(std::string("mono dither=") + row.dither, *picture), Status::Ok);
      EXPECT_EQ(ColorAt(*picture, 0, 0), 0u);
      EXPECT_EQ(ColorAt(*picture, 1, 0), below == 0 ? 0xffffffu : 0u);
    }
  }
}

TEST(Reduce, FewColorsAreKeptExactly) {
  const PicturePointer picture =
      MakePicture(50, 40, [](int32_t x, int32_t y) { return Scatter(x, y) % 11 * 0x050301u; });
  const std::vector<uint32_t> before = Colors(*picture);
  ASSERT_EQ(Apply("reduce 200", *picture), Status::Ok);
  EXPECT_EQ(picture->image.Bits(), 4);
  EXPECT_EQ(Colors(*picture), before);
  ASSERT_EQ(Apply("reduce 5", *picture), Status::Ok);
  EXPECT_LE(ColorsUsed(*picture), 5u);
}

TEST(Mono, CutsAsThresholdDoes) {
  for (const int32_t t : {1, 77, 128, 255}) {
    SCOPED_TRACE(t);
    const PicturePointer cut = Sweep(), mono = Sweep();
    ASSERT_EQ(Apply("threshold " + std::to_string(t), *cut), Status::Ok);
    ASSERT_EQ(Apply("mono dither=none threshold=" + std::to_string(t), *mono), Status::Ok);
    EXPECT_EQ(Colors(*mono), Colors(*cut));
    EXPECT_EQ(mono->image.Bits(), 1);
  }
}

std::string ActOf(int32_t colors, bool trailer) {
  std::string bytes(768, '\0');
  for (int32_t i = 0; i < 3 * colors; ++i)
    bytes[static_cast<size_t>(i)] = static_cast<char>(i * 40 + 1);
  if (trailer) bytes += {'\0', static_cast<char>(colors), '\xff', '\xff'};
  return bytes;
}

TEST(ColorTable, ReadsEveryTypeAndRejectsOthers) {
  const struct {
    const char* name;
    std::string contents;
    int32_t count;  // 0: rejected
  } rows[] = {
      {"ccl", "# two colors\n1 41 81\n\n 121\t161 201 # the second\r\n", 2},
      {"ccl without a line end", "1 41 81\n121 161 201", 2},
      {"act", ActOf(2, true), 2},
      {"act without a count", ActOf(2, false), 256},
      {"gpl", "GIMP Palette\nName: Two\nColumns: 2\n# made by hand\n  1  41  81\tfirst\n121 161 201 second color\n", 2},
      {"gpl without headers", "GIMP Palette\n1 41 81\n121 161 201\n", 2},
      {"pal", "JASC-PAL\r\n0100\r\n2\r\n1 41 81\r\n121 161 201\r\n", 2},
      {"empty", "", 0},
      {"comments only", "# nothing\n\n", 0},
      {"level too high", "1 2 256\n", 0},
      {"negative", "1 -2 3\n", 0},
      {"two numbers", "1 2\n", 0},
      {"four numbers", "1 2 3 4\n", 0},
      {"no blanks", "1,2,3\n", 0},
      {"pal with too few colors", "JASC-PAL\n0100\n3\n1 41 81\n121 161 201\n", 0},
      {"pal with too many colors", "JASC-PAL\n0100\n1\n1 41 81\n121 161 201\n", 0},
      {"pal of another version", "JASC-PAL\n0200\n2\n1 41 81\n121 161 201\n", 0},
      {"pal with a huge count", "JASC-PAL\n0100\n99999999999\n1 41 81\n", 0},
      {"act with too high a count", ActOf(2, false) + std::string("\x7f\x02\xff\xff", 4), 0},
      {"act cut short", ActOf(2, false).substr(0, 767), 0},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    Palette palette{};
    int32_t count = 0;
    EXPECT_EQ(ReadColorTable(row.contents, palette, count), row.count == 0 ? Status::DamagedFile : Status::Ok);
    EXPECT_EQ(count, row.count);
    if (row.count == 0) continue;
    for (size_t i = 0; i < 6; ++i) EXPECT_EQ(palette[i], 1 + 40 * i);
  }
  std::string lines;
  for (int32_t i = 0; i < 257; ++i) lines += "1 2 3\n";
  Palette palette{};
  int32_t count = 0;
  EXPECT_EQ(ReadColorTable(lines, palette, count), Status::DamagedFile);
}

TEST(Reduce, UsesTheColorsOfAFile) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("colors.ccl");
  WriteText(path, "255 0 0\n0 255 0\n0 0 255\n");
  WriteText(folder.Path("broken.ccl"), "red\n");
  const KeyValues keys = [&](std::string_view key) {
    return key == "ColourTableFile" ? path : std::string();
  };
  const std::set<uint32_t> primaries{0xff0000, 0x00ff00, 0x0000ff};
  for (const std::string& text : {"reduce palette=" + path, std::string("reduce palette=file"),
                                  "reduce palette=file file=" + path}) {
    SCOPED_TRACE(text);
    Recipe recipe;
    ASSERT_TRUE(ReadRecipe(text, keys, recipe).empty());
    const PicturePointer picture = Sweep();
    ASSERT_EQ(ApplySteps(*picture, recipe.common, {}), Status::Ok);
    EXPECT_EQ(picture->image.Bits(), 4);
    for (const uint32_t color : Colors(*picture)) ASSERT_TRUE(primaries.contains(color));
  }
  for (const std::string& text :
       {"reduce palette=" + folder.Path("broken.ccl"), "reduce palette=" + folder.Path("none.ccl"),
        std::string("reduce palette=/dev/zero"),
        "reduce palette=file file=" + folder.Path("none.ccl")}) {
    SCOPED_TRACE(text);
    Recipe recipe;
    const auto mistakes = ReadRecipe(text, keys, recipe);
    ASSERT_EQ(mistakes.size(), 1u);
    EXPECT_EQ(mistakes[0].operation, "reduce");
  }
}

}  // namespace
}  // namespace fotomill::test
