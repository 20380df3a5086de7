#include "formats/gem/gem.h"

#include <gtest/gtest.h>

#include "formats/gem/gem_lines.h"
#include "support/codecs.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// A 16-byte header plus extension words; planes, width and height as words.
std::string Header(const char* planes, const char* size, const char* words = "0008") {
  return std::string("0001 ") + words + planes + " 0002 0174 0174 " + size + "  ";
}
// An XIMG color table with four colors.
const std::string kFour =
    "58494D47 0000  03E8 03E8 03E8  03E8 0000 0000  0000 01F4 0000  0000 0000 0000  ";

TEST(Gem, ReadsAllVariants) {
  const std::string two = " 80 02 55 33 ";  // a line of two planes of one byte each
  const struct {
    const char* name;
    std::string file;
    Status status;
    const char* pixels;
    const char* colors;  // red, green, blue of the first four
  } rows[] = {
      {"black and white", Header("0001", "0008 0001") + "80 01 0F", Status::Ok, "0 0 0 0 1 1 1 1", "FFFFFF 000000"},
      {"two planes", Header("0002", "0008 0001") + two, Status::Ok, "0 1 2 3 0 1 2 3",
       "FFFFFF FF0000 00FF00 000000"},
      {"a word that says gray", Header("0002", "0008 0001", "0009") + "0001" + two, Status::Ok, "0 1 2 3 0 1 2 3",
       "FFFFFF FF0000 00FF00 000000"},
      {"XIMG", Header("0002", "0008 0001", "0017") + kFour + two, Status::Ok, "0 1 2 3 0 1 2 3",
       "FFFFFF FF0000 008000 000000"},
      {"XIMG of what is missing", Header("0001", "0008 0001", "0011") + "58494D47 0001 0000 0000 0000 03E8 0000 0000 80 01 0F",
       Status::Ok, "0 0 0 0 1 1 1 1", "FFFFFF 00FFFF"},
      {"another model", Header("0001", "0008 0001", "0011") + "58494D47 0002 0000 0000 0000 03E8 0000 0000 80 01 0F",
       Status::UnsupportedFormat, "", ""},
      {"STTT stores its planes whole", Header("0002", "0008 0002", "000F") + "53545454 0004 0000 0700 0070 0123" + "80 04 55 00  33 FF",
       Status::Ok, "0 1 2 3 0 1 2 3 / 2 2 2 2 2 2 2 2", "000000 FF0000 00FF00 24496D"},
      {"colors of the STE", Header("0002", "0008 0001", "000F") + "53545454 0004 0000 0F00 0888 0007" + two, Status::Ok,
       "0 1 2 3 0 1 2 3", "000000 FF0000 111111 0000EE"},
      {"HyperPaint", Header("0002", "0008 0001", "000D") + "0080 0000 0700 0070 0007" + two, Status::Ok, "0 1 2 3 0 1 2 3",
       "000000 FF0000 00FF00 0000FF"},
      {"16 bits", Header("0010", "0002 0001") + "80 04 F800 07FF", Status::Ok, "FF0000 00FFFF", ""},
      {"24 bits", Header("0018", "0001 0001") + "80 03 01 02 03", Status::Ok, "010203", ""},
      {"32 bits", Header("0020", "0001 0001") + "80 04 00 01 02 03", Status::Ok, "010203", ""},
      {"planes of each color", Header("0005", "0008 0001", "000E") + "54494D47 0003 0002 0002 0001 80 05 55 33 F0 00 AA",
       Status::Ok, "0055FF 555500 AA55FF FF5500 0000FF 550000 AA00FF FF0000", ""},
      {"other sums of planes", Header("0006", "0008 0001", "000E") + "54494D47 0003 0002 0002 0001 80 05 55 33 F0 00 AA",
       Status::UnsupportedFormat, "", ""},
      {"12 planes", Header("000C", "0008 0001") + "80 01 00", Status::UnsupportedFormat, "", ""},
      {"no planes", Header("0000", "0008 0001") + "80 01 00", Status::DamagedFile, "", ""},
      {"a header of 7 words", Header("0001", "0008 0001", "0007") + "80 01 00", Status::DamagedFile, "", ""},
      {"a header cut short", Header("0001", "0008 0001", "0009"), Status::FileReadError, "", ""},
      {"version 4", "0004 0008 0001 0002 0174 0174 0008 0001 80 01 00", Status::DamagedFile, "", ""},
      {"patterns of 9 bytes", "0001 0008 0001 0009 0174 0174 0008 0001 80 01 00", Status::DamagedFile, "", ""},
      {"lines cut short", Header("0001", "0008 0002") + "80 01 0F", Status::FileReadError, "", ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(GemRead, Hex(row.file));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    const Bytes colors = Hex(row.colors);
    EXPECT_TRUE(std::equal(colors.begin(), colors.end(), decoded.picture->palette.begin()));
  }
}

TEST(Gem, ReversesBitsOfGraysWithoutAPalette) {
  const Decoded decoded = Describe(GemInfo, Hex(Header("0008", "0008 0001")));
  ASSERT_EQ(decoded.status, Status::Ok);
  const Palette& palette = decoded.picture->palette;
  EXPECT_EQ((std::vector<int>{palette[0], palette[3], palette[6], palette[9], palette[765]}),
            (std::vector<int>{255, 127, 191, 63, 0}));
}

TEST(Gem, DecodesLines) {
  const struct {
    const char* name;
    const char* code;
    size_t size, pattern;
    std::vector<const char*> lines;  // the rest is missing
  } rows[] = {
      {"every token", "82 03 80 02 12 34 00 02 AB CD", 11, 2, {"FFFF 000000 1234 ABCDABCD"}},
      {"a line that comes three times, then another", "00 00 FF 03 80 01 77 81", 1, 2, {"77", "77", "77", "FF"}},
      {"runs over the end of a line", "03 83", 2, 1, {"0000", "00FF", "FFFF"}},
      {"a line that comes no time is one", "00 00 FF 00 81", 1, 1, {"FF"}},
      {"bytes of the line above", "80 03 01 02 03 80 01 09 00 00 01", 3, 1, {"010203", "090203"}},
      {"no line above", "00 00 01", 2, 1, {}},
      {"more than the line above has", "80 02 01 02 80 01 09 00 00 01", 2, 1, {"0102"}},
      {"a pattern cut short", "00 02 AB", 4, 2, {}},
      {"bytes cut short", "80 03 01 02", 3, 2, {}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Bytes code = Hex(row.code);
    GemLines lines(code, row.size, row.pattern);
    for (const char* const line : row.lines) {
      const auto read = lines.Next();
      EXPECT_EQ(Bytes(read.begin(), read.end()), Hex(line));
    }
    EXPECT_TRUE(lines.Next().empty());
  }
  const Bytes longest = Hex("80 00" + std::string(512, '1'));
  GemLines lines(longest, 256, 1);
  EXPECT_EQ(lines.Next().size(), 256u);
}

TEST(Gem, EncodesLines) {
  const struct {
    const char* name;
    std::string line;
    size_t unit;
    const char* code;
  } rows[] = {
      {"solid bytes from three", "0000 FFFFFF 0000", 1, "80 02 0000 83 80 02 0000"},
      {"patterns from six bytes", "0909090909 05 080808080808", 1, "80 06 0909090909 05 00 06 08"},
      {"patterns of three bytes", "010203 010203 010203 04", 3, "00 03 010203 80 01 04"},
      {"a rest of a pattern", "010203 010203 010203 0102", 3, "00 03 010203 80 02 0102"},
      {"128 solid bytes", std::string(256, 'F'), 1, "FF 81"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    Bytes code;
    EncodeGemLine(Hex(row.line), row.unit, code);
    EXPECT_EQ(code, Hex(row.code));
  }
}

TEST(Gem, WritesCompatibleFiles) {
  const PicturePointer mono = PatternPicture(9, 3, 1);
  // black on the left
  for (int32_t i = 0; i < 27; ++i) SetPixel(mono->image, i % 9, i / 9, i % 9 != 0);
  EXPECT_EQ(Encode(GemWrite, *mono), Hex("0001 0008 0001 0001 0174 0174 0009 0003  00 00 FF 03  80 02 80 00"));
  mono->palette[0] = 255;  // red: it needs a palette
  const Bytes red = Encode(GemWrite, *mono);
  EXPECT_EQ(
      Bytes(red.begin(), red.begin() + 34),
      Hex("0001 0011 0001 0001 0174 0174 0009 0003 58494D47 0000 03E8 0000 0000 03E8 03E8 03E8"));
  const PicturePointer color = PatternPicture(3, 1, 24);
  for (int32_t x = 0; x < 3; ++x) SetPixel(color->image, x, 0, 0x010203);
  EXPECT_EQ(Encode(GemWrite, *color), Hex("0001 0008 0018 0003 0174 0174 0003 0001  00 03 01 02 03"));
  const PicturePointer tall = PatternPicture(1, 300, 8);
  for (int32_t y = 0; y < 300; ++y) SetPixel(tall->image, 0, y, 5);
  EXPECT_TRUE(SamePixels(Decode(GemRead, Encode(GemWrite, *tall)).picture->image, tall->image));
}

}  // namespace
}  // namespace fotomill::test
