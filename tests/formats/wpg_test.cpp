#include "formats/wordperfect/wpg.h"

#include <gtest/gtest.h>

#include "formats/wordperfect/wpg_rows.h"
#include "support/codecs.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

std::string Prefix(const char* version, const char* key = "0000", const char* type = "16") {
  return std::string("FF575043 10000000 01") + type + version + key + " 0000  ";
}
const std::string kOne = Prefix("0100") + "0F 06 0100 6400 6400  ", kTwo = Prefix("0200");

TEST(Wpg, ReadsItsBitmaps) {
  // 4 x 2 pixels of 2 bits.
  const std::string bitmap = "0B 0E 0400 0200 0200 4B00 4B00  02 1B E4 ";
  const struct {
    const char* name;
    std::string file;
    Status status;
    const char* pixels;
    const char* colors;  // of the first four
  } rows[] = {
      {"2 bits, the colors of VGA", kOne + bitmap + "10 00", Status::Ok, "0 1 2 3 / 3 2 1 0",
       "000000 0000AA 00AA00 00AAAA"},
      {"a color map from 1", kOne + "0E 0A 0100 0200 010203 040506" + bitmap, Status::Ok, "0 1 2 3 / 3 2 1 0",
       "000000 010203 040506 00AAAA"},
      {"a size of two bytes", kOne + "0B FF0E00 0400 0200 0200 4B00 4B00 02 1B E4", Status::Ok, "0 1 2 3 / 3 2 1 0", ""},
      {"a size of four bytes", kOne + "0B FF0080 0E00 0400 0200 0200 4B00 4B00 02 1B E4", Status::Ok,
       "0 1 2 3 / 3 2 1 0", ""},
      {"behind its place", kOne + "14 17 0000 0000 0000 0000 0000 0400 0200 0200 4B00 4B00 02 1B E4", Status::Ok,
       "0 1 2 3 / 3 2 1 0", ""},
      {"1 bit is black and white", kOne + "0B 0C 0800 0100 0100 4B00 4B00 01 0F", Status::Ok, "0 0 0 0 1 1 1 1",
       "000000 FFFFFF"},
      {"1 bit with colors", kOne + "0E 0A 0000 0200 010203 040506 0B 0C 0800 0100 0100 4B00 4B00 01 0F", Status::Ok,
       "0 0 0 0 1 1 1 1", "010203 040506"},
      {"the larger of two", kOne + "0B 0C 0100 0100 0800 4B00 4B00 01 07" + bitmap, Status::Ok, "0 1 2 3 / 3 2 1 0", ""},
      {"records behind the end", kOne + "10 00" + bitmap, Status::NoImages, "", ""},
      {"a drawing", kOne + "05 04 0000 0000 10 00", Status::NoImages, "", ""},
      {"a depth of 3", kOne + "0B 0C 0400 0200 0300 4B00 4B00 01 00", Status::UnsupportedFormat, "", ""},
      {"rows cut short", kOne + "0B 0D 0400 0200 0200 4B00 4B00 01 1B", Status::FileReadError, "", ""},
      {"encrypted", Prefix("0100", "0100") + bitmap, Status::InvalidPassword, "", ""},
      {"a document", Prefix("0100", "0000", "0A") + bitmap, Status::DamagedFile, "", ""},
      {"version 3", Prefix("0300") + bitmap, Status::UnsupportedFormat, "", ""},
      {"another file", "89504E47 0D0A1A0A 00000000 00000000", Status::DamagedFile, "", ""},
      {"a short prefix", "FF575043 1000", Status::FileReadError, "", ""},
      {"2.0: runs, map with alpha", kTwo + "04 0C 00 0C 0000 0200 010203 00 040506 00  04 0E 00 0B 0200 0200 04 01 01 01 00 FE 00",
       Status::Ok, "1 0 / 1 0", "010203 040506"},
      {"2.0: plain colors", kTwo + "04 0E 02 09 0100 0100 08 00 010203", Status::Ok, "010203", ""},
      {"2.0: a unit's size before them", kTwo + "04 0E 00 0B 0100 0100 08 00 7D01 010203", Status::Ok, "010203", ""},
      {"2.0: with alpha", kTwo + "04 0E 00 0A 0100 0100 09 00 010203 80", Status::Ok, "010203", ""},
      {"2.0: 5 bits a color", kTwo + "04 0E 00 08 0100 0100 06 00 1F 7C", Status::Ok, "FF00FF", ""},
      {"2.0: gray", kTwo + "04 0E 00 07 0100 0100 0C 00 05", Status::Ok, "5", "000000 010101"},
      {"2.0: 4 bits", kTwo + "04 0E 00 08 0300 0100 03 00 12 30", Status::Ok, "1 2 3", ""},
      {"2.0: another format", kTwo + "04 0E 00 07 0100 0100 0A 00 05", Status::UnsupportedFormat, "", ""},
      {"2.0: another compression", kTwo + "04 0E 00 07 0100 0100 04 02 05", Status::UnsupportedFormat, "", ""},
      {"2.0: too few plain rows", kTwo + "04 0E 00 08 0100 0100 08 00 0102", Status::FileReadError, "", ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(WpgRead, Hex(row.file));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    const Bytes colors = Hex(row.colors);
    EXPECT_TRUE(std::equal(colors.begin(), colors.end(), decoded.picture->palette.begin()));
  }
}

TEST(Wpg, ColorsOfVga) {
  const Decoded decoded = Describe(WpgInfo, Hex(kOne + "0B 0C 0100 0100 0800 4B00 4B00 01 07"));
  ASSERT_EQ(decoded.status, Status::Ok);
  const std::pair<size_t, const char*> rows[] = {
      {6, "AA5500"}, {7, "AAAAAA"}, {8, "555555"}, {15, "FFFFFF"}, {17, "141414"}, {32, "0000FF"},
      {33, "4100FF"}, {36, "FF00FF"}, {40, "FF0000"}, {48, "00FF00"}, {52, "00FFFF"}, {56, "7D7DFF"},
      {104, "000071"}, {247, "2C3041"}, {248, "000000"}, {255, "000000"},
  };
  for (const auto& [index, color] : rows) {
    const auto* const entry = &decoded.picture->palette[3 * index];
    EXPECT_EQ(Bytes(entry, entry + 3), Hex(color)) << index;
  }
}

TEST(Wpg, DecodesRows) {
  const struct {
    const char* name;
    const char* code;
    WpgCoding coding;
    std::vector<const char*> rows;  // the rest is missing
  } rows[] = {
      {"every token of version 1", "80 02 83 07 02 01 02", WpgCoding::Runs1, {"FFFF0707", }},
      {"a row that comes again", "84 07 00 02 84 09", WpgCoding::Runs1, {"07070707", "07070707", "07070707", "09090909"}},
      {"runs over the end of a row", "86 07 82 09", WpgCoding::Runs1, {"07070707", "07070909"}},
      {"a repetition within a row", "82 07 00 01 82 07", WpgCoding::Runs1, {}},
      {"nothing to repeat", "00 01 84 07", WpgCoding::Runs1, {}},
      {"a run without value", "84", WpgCoding::Runs1, {}},
      {"every token of version 2", "7F 00 FF 00 80 07 00 09", WpgCoding::Runs2, {"00FF0709"}},
      {"units of two bytes", "7D 02 7F 00 80 0102 FD 00 00 0304", WpgCoding::Runs2, {"00000102", "01020304"}},
      {"a difference", "83 07 7E 03 01 00 00 02 83 07", WpgCoding::Runs2, {"07070707", "06070705", "07070707"}},
      {"a row that comes twice more", "83 07 FE 01", WpgCoding::Runs2, {"07070707", "07070707", "07070707"}},
      {"units of 9 bytes", "7D 09 83 07", WpgCoding::Runs2, {}},
      {"units of no byte", "7D 00 83 07", WpgCoding::Runs2, {}},
      {"nothing but unit sizes", "7D 01 7D 01 7E 7E", WpgCoding::Runs2, {}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Bytes code = Hex(row.code);
    WpgRows decoder(code, 4, row.coding);
    for (const char* const expected : row.rows) {
      const auto read = decoder.Next();
      EXPECT_EQ(Bytes(read.begin(), read.end()), Hex(expected));
    }
    EXPECT_TRUE(decoder.Next().empty());
  }
}

TEST(Wpg, WritesVersionOne) {
  const PicturePointer picture = PatternPicture(8, 3, 1);
  for (int32_t i = 0; i < 24; ++i) SetPixel(picture->image, i % 8, i / 8, i / 8 < 2 ? i % 2 : 1);
  EXPECT_EQ(Encode(WpgWrite, *picture),
            Hex(Prefix("0100") + "0F 06 0100 8000 3000  0E FF0080 0A00 0000 0200 000000 FFFFFF "
                                 "0B FF0080 1000 0800 0300 0100 4B00 4B00  01 55 00 01 01 FF  10 00"));
  const PicturePointer wide = PatternPicture(65535, 2, 4);
  const Bytes file = Encode(WpgWrite, *wide);
  EXPECT_TRUE(SamePixels(Decode(WpgRead, file).picture->image, wide->image));
  EXPECT_EQ(file[20] | file[21] << 8, 65535);  // printed width, in 1/1200 inch
}

}  // namespace
}  // namespace fotomill::test
