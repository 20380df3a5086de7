#include "formats/bmp/bmp.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "core/limits.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;
using testing::ElementsAreArray;

void AppendLittle(Bytes& bytes, uint32_t value, int count) {
  for (int i = 0; i < count; ++i) bytes.push_back(static_cast<uint8_t>(value >> (8 * i)));
}

struct Header {
  int32_t width = 1, height = 1;
  uint16_t bits = 8;
  uint32_t compression = 0;
  int32_t offset = -1;  // -1: right after header and palette
  uint32_t infoSize = 40;
};

// A file of the Windows dialect: header, then `rest` after the 54 bytes.
Bytes Windows(const Header& header, std::string_view rest) {
  Bytes bytes = Hex("42 4D  00000000 00000000");
  const uint32_t palette = header.bits > 8 ? 0 : 4u << header.bits;
  AppendLittle(bytes, header.offset < 0 ? 54 + palette : static_cast<uint32_t>(header.offset), 4);
  AppendLittle(bytes, header.infoSize, 4);
  AppendLittle(bytes, static_cast<uint32_t>(header.width), 4);
  AppendLittle(bytes, static_cast<uint32_t>(header.height), 4);
  AppendLittle(bytes, 1, 2);
  AppendLittle(bytes, header.bits, 2);
  AppendLittle(bytes, header.compression, 4);
  bytes.resize(54);
  const Bytes tail = Hex(rest);
  bytes.insert(bytes.end(), tail.begin(), tail.end());
  return bytes;
}

// As above, with a zeroed palette before the pixels.
Bytes Indexed(const Header& header, std::string_view pixels) {
  return Windows(header, std::string(size_t{8} << header.bits, '0') + std::string(pixels));
}

Bytes Os2(uint16_t width, uint16_t height, uint16_t bits, std::string_view rest) {
  // an invalid pixel offset, which is ignored
  Bytes bytes = Hex("42 4D  00000000 00000000  FFFFFF7F  0C000000");
  for (const uint16_t value : {width, height, uint16_t{1}, bits}) AppendLittle(bytes, value, 2);
  const Bytes tail = Hex(rest);
  bytes.insert(bytes.end(), tail.begin(), tail.end());
  return bytes;
}

struct ReadCase {
  const char* name;
  Bytes file;
  Status status;
  const char* pixels;
};

void ExpectReads(std::span<const ReadCase> rows) {
  for (const ReadCase& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(BmpRead, row.file);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    if (row.status != Status::Ok) {
      EXPECT_TRUE(decoded.picture->alpha.Empty());
    }
  }
}

TEST(BmpRead, UncompressedRows) {
  const ReadCase rows[] = {
      {"1 bit, bottom row first", Indexed({10, 2, 1}, "80400000 FF800000"), Status::Ok,
       "1 1 1 1 1 1 1 1 1 0 / 1 0 0 0 0 0 0 0 0 1"},
      {"4 bits", Indexed({3, 1, 4}, "12300000"), Status::Ok, "1 2 3"},
      {"8 bits, top row first", Indexed({2, -2, 8}, "01020000 03040000"), Status::Ok, "1 2 / 3 4"},
      {"24 bits", Windows({1, 2, 24}, "010203 00 040506 00"), Status::Ok, "060504 / 030201"},
      {"24 bits, pixels where the offset says", Windows({1, 1, 24, 0, 57}, "FFFFFF 010203 00"), Status::Ok, "030201"},
      {"24 bits, offset back into the header", Windows({1, 1, 24, 0, 0}, ""), Status::Ok, "004D42"},
      {"32 bits", Windows({2, 1, 32}, "010203FF 040506FF"), Status::Ok, "030201 060504"},
      {"5-5-5 gives red first", Windows({2, 1, 16}, "1F00 007C"), Status::Ok, "F80000 0000F8"},
      {"5-6-5 masks, pixels 12 bytes past the offset", Windows({2, 1, 16, 3, 54}, "00F80000 E0070000 1F000000  1F00 E007"),
       Status::Ok, "0000F8 00FC00"},
      {"other masks are 5-5-5", Windows({2, 1, 16, 3, 54}, "007C0000 E0030000 1F000000  1F00 007C"), Status::Ok, "F80000 0000F8"},
      {"2 bits are copied as they are", Indexed({5, 1, 2}, "1B 40 0000"), Status::Ok, "1 11 4 0 0"},
      {"12 bits are copied as they are", Windows({2, 1, 12}, "01020300"), Status::Ok, "030201 000000"},
      {"48 bits are cut to the row", Windows({1, 1, 48}, "010203040506 0000"), Status::Ok, "030201"},
      {"unknown compression counts as none", Indexed({4, 1, 8, 7}, "01020304"), Status::Ok, "1 2 3 4"},
      {"padding is needed", Windows({1, 1, 24}, "010203"), Status::FileReadError, ""},
      {"short row", Indexed({4, 2, 8}, "01020304 050607"), Status::FileReadError, ""},
      {"short last row of 16 bits", Windows({2, 2, 16}, "1F001F00 1F00"), Status::Ok, "F80000 000000 / F80000 F80000"},
      {"half a pixel in the last row of 16 bits", Windows({2, 1, 16}, "1F001F"), Status::Ok, "F80000 000000"},
      {"short row of 16 bits before the last", Windows({2, 2, 16}, "1F00"), Status::FileReadError, ""},
      {"short masks", Windows({1, 1, 16, 3, 20}, "00F80000 E0070000 1F0000"), Status::FileReadError, ""},
      {"offset beyond the end", Windows({1, 1, 16, 0, 60}, "1F000000"), Status::FileReadError, ""},
  };
  ExpectReads(rows);
}

TEST(BmpRead, RunLengthRows) {
  const ReadCase rows[] = {
      {"run and literals", Indexed({5, 2, 8, 1}, "03 07  00 02 01 00  01 09  00 00   00 05 01 02 03 04 05 FF  00 01"), Status::Ok,
       "1 2 3 4 5 / 7 7 7 0 9"},
      {"literals of even length have no pad", Indexed({4, 1, 8, 1}, "00 04 01 02 03 04  00 01"), Status::Ok, "1 2 3 4"},
      {"beyond the row and above the top", Indexed({2, 1, 8, 1}, "05 03  01 04  00 00  02 05  00 02 FF FF  02 06  00 01"),
       Status::Ok, "3 3"},
      {"move up", Indexed({2, 2, 8, 1}, "00 02 01 01  01 05  00 01"), Status::Ok, "0 5 / 0 0"},
      {"top row first", Indexed({1, -2, 8, 1}, "01 05  00 00  01 06  00 01"), Status::Ok, "5 / 6"},
      {"no end of bitmap", Indexed({1, 1, 8, 1}, "01 05"), Status::FileReadError, ""},
      {"ends after a count", Indexed({1, 1, 8, 1}, "01 05 00"), Status::FileReadError, ""},
      {"ends in a move", Indexed({1, 1, 8, 1}, "00 02 01"), Status::FileReadError, ""},
      {"pad of a literal run missing", Indexed({3, 1, 8, 1}, "00 03 01 02 03"), Status::FileReadError, ""},
      {"runs of 4 bits alternate", Indexed({7, 1, 4, 2}, "05 12  00 00  00 01"), Status::Ok, "1 2 1 2 1 0 0"},
      {"an odd start and a run cut by the row", Indexed({6, 1, 4, 2}, "01 30  FF 12  00 01"), Status::Ok, "3 1 2 1 2 1"},
      {"5 literals of 4 bits", Indexed({6, 1, 4, 2}, "01 90  00 05 12 34 5F FF  00 01"), Status::Ok, "9 1 2 3 4 5"},
      {"6 and 7 literals of 4 bits", Indexed({7, 2, 4, 2}, "00 06 12 34 56 FF  00 00  00 07 12 34 56 7F  00 01"), Status::Ok,
       "1 2 3 4 5 6 7 / 1 2 3 4 5 6 0"},
      {"8-bit codes in a 4-bit picture fill its bytes", Indexed({4, 1, 4, 1}, "04 12  00 01"), Status::Ok, "1 2 1 2"},
      {"4-bit codes in an 8-bit picture fill its first half", Indexed({4, 1, 8, 2}, "04 12  00 01"), Status::Ok, "18 18 0 0"},
      {"8-bit codes in a 24-bit picture", Windows({3, 1, 24, 1}, "03 12  00 01"), Status::Ok, "121212 000000 000000"},
  };
  ExpectReads(rows);
}

TEST(BmpRead, Os2Rows) {
  const ReadCase rows[] = {
      {"1 bit after its palette", Os2(3, 1, 1, "000000 FFFFFF  A0000000 0000000000000000000000000000000000000000"), Status::Ok,
       "1 0 1"},
      {"24 bits after the header", Os2(1, 7, 24, "01020300 01020300 01020300 01020300 01020300 01020300 04050600"), Status::Ok,
       "060504 / 030201 / 030201 / 030201 / 030201 / 030201 / 030201"},
      {"height is unsigned", Os2(1, 0x8001, 1, "000000 FFFFFF 0000000000000000000000000000000000000000000000"),
       Status::FileReadError, ""},
      {"a whole file of less than 54 bytes", Os2(1, 1, 24, "01020300"), Status::FileReadError, ""},
  };
  ExpectReads(rows);
}

TEST(BmpRead, PaletteFollowsTheShortHeader) {
  struct Row {
    const char* name;
    Bytes file;
    Bytes begin;  // of the palette
  };
  const std::string padding(2 * 1024, '0');
  const Row rows[] = {
      {"blue, green, red, 0", Windows({1, 1, 8}, "01020300 04050600" + padding), Hex("030201 060504 000000")},
      {"a longer header does not move it", Windows({1, 1, 8, 0, -1, 108}, "01020300 04050600" + padding), Hex("030201 060504")},
      {"a short one leaves the rest", Windows({1, 1, 4, 0, 0}, "01020300 040506"), Hex("030201 FFFFFF 000000")},
      {"OS/2 has three bytes an entry", Os2(1, 1, 8, "010203 040506" + padding), Hex("030201 060504 000000")},
      {"deep pictures get the display palette", Windows({1, 1, 24}, "00000000"), Hex("000000 000055 0000AA 0000FF 002400")},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    for (const Decoded& decoded : {Describe(BmpInfo, row.file), Decode(BmpRead, row.file)}) {
      EXPECT_EQ(decoded.status, Status::Ok);
      EXPECT_THAT(std::span(decoded.picture->palette).first(row.begin.size()), ElementsAreArray(row.begin));
    }
  }
}

TEST(BmpRead, FourthChannelBecomesAlpha) {
  const ScopedSettings restore;
  const Bytes file = Windows({2, -2, 32}, "01020310 04050620  07080930 0A0B0C40");
  Decoded decoded = Decode(BmpRead, file);
  EXPECT_EQ(PixelText(decoded.picture->alpha), "16 32 / 48 64");
  EXPECT_EQ(decoded.picture->alphaFlags, kHasAlpha);
  EXPECT_EQ(decoded.picture->bitsPerPixel, 24);

  settings.UseAlphaChannels = 0;
  decoded = Decode(BmpRead, file);
  EXPECT_TRUE(decoded.picture->alpha.Empty());
  EXPECT_EQ(decoded.picture->alphaFlags, kHasAlpha);
}

TEST(BmpRead, CopiesPadding) {
  const Decoded decoded = Decode(BmpRead, Indexed({1, 1, 8}, "01 AABBCC"));
  EXPECT_THAT(decoded.picture->image.StoredRow(0), ElementsAreArray(Hex("01AABBCC")));
}

TEST(BmpInfo, FactsOfTheHeader) {
  struct Row {
    const char* name;
    Bytes file;
    Status info, read;
    const char* typeName;
    int32_t width, height, bitsPerPixel;
    uint64_t imageBytes;
    uint8_t alphaFlags;
  };
  const int32_t least = INT32_MIN;
  const Row rows[] = {
      {"2 bits stay 2", Indexed({9, 3, 2}, "000000000000000000000000"), Status::Ok, Status::Ok, "Windows bitmap", 9, 3, 2, 12, 0},
      {"16 bits are 24", Windows({9, -3, 16}, std::string(240, '0')), Status::Ok, Status::Ok, "Windows bitmap", 9, 3, 24, 144, 0},
      {"32 bits have alpha", Windows({1, 1, 32}, "00000000"), Status::Ok, Status::Ok, "Windows bitmap", 1, 1, 24, 24, 1},
      {"OS/2", Os2(8, 1, 8, std::string(2 * 800, '0')), Status::Ok, Status::Ok, "OS/2 bitmap", 8, 1, 8, 8, 0},
      {"zero width", Windows({0, 1, 24}, "00"), Status::DamagedFile, Status::DamagedFile, "", 0, 0, 0, 0, 0},
      {"negative width", Windows({-5, 1, 24}, "00"), Status::DamagedFile, Status::DamagedFile, "", 0, 0, 0, 0, 0},
      {"zero height", Windows({1, 0, 24}, "00"), Status::DamagedFile, Status::DamagedFile, "", 0, 0, 0, 0, 0},
      {"the least height", Windows({1, least, 24}, "00"), Status::DamagedFile, Status::DamagedFile, "", 0, 0, 0, 0, 0},
      {"no bits", Windows({1, 1, 0}, "00000000"), Status::DamagedFile, Status::DamagedFile, "", 0, 0, 0, 0, 0},
      {"the largest sizes", Windows({INT32_MAX, INT32_MAX, 65535}, "00"), Status::Ok, Status::FileReadError, "Windows bitmap",
       INT32_MAX, INT32_MAX, 24, uint64_t{268435456} * 24 * INT32_MAX, 1},
      {"beyond the limit", Windows({40000, 40000, 8, 1, 54}, "0001"), Status::Ok, Status::MemoryAllocationError, "Windows bitmap",
       40000, 40000, 8, uint64_t{5000} * 8 * 40000, 0},
      {"short header", Bytes(53, 'B'), Status::DamagedFile, Status::FileReadError, "", 0, 0, 0, 0, 0},
      {"empty", {}, Status::DamagedFile, Status::FileReadError, "", 0, 0, 0, 0, 0},
      {"another signature", Hex("4241" + std::string(200, '0')), Status::DamagedFile, Status::DamagedFile, "", 0, 0, 0, 0, 0},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Describe(BmpInfo, row.file);
    const PictureRecord& picture = *decoded.picture;
    EXPECT_EQ(decoded.status, row.info);
    EXPECT_EQ(picture.typeName.view(), row.typeName);
    EXPECT_EQ(picture.width, row.width);
    EXPECT_EQ(picture.height, row.height);
    EXPECT_EQ(picture.bitsPerPixel, row.bitsPerPixel);
    EXPECT_EQ(picture.imageBytes, row.imageBytes);
    EXPECT_EQ(picture.alphaFlags, row.alphaFlags);
    EXPECT_EQ(picture.fileSize, row.file.size());
    const Decoded read = Decode(BmpRead, row.file);
    EXPECT_EQ(read.status, row.read);
    EXPECT_EQ(read.picture->image.Empty(), row.read != Status::Ok);
  }
}

TEST(BmpInfo, MissingFileDoesNotOpen) {
  PictureRecord picture;
  EXPECT_EQ(BmpInfo(picture, RequestFor("/nowhere/a.bmp")), Status::FileOpenError);
  EXPECT_EQ(BmpRead(picture, RequestFor("/nowhere/a.bmp")), Status::FileOpenError);
  picture.fileName.AssignCut("/nowhere/a.bmp");
  EXPECT_EQ(BmpDetails(picture), Status::FileOpenError);
}

// A picture of one row; its alpha values, if requested, count up from 0x80.
PicturePointer OneRow(int32_t bitsPerPixel, std::initializer_list<int32_t> pixels,
                      bool alpha = false) {
  PicturePointer picture = PatternPicture(static_cast<int32_t>(pixels.size()), 1, bitsPerPixel);
  int32_t x = 0;
  for (const int32_t pixel : pixels) SetPixel(picture->image, x++, 0, pixel);
  if (alpha && NewAlphaPlane(picture->width, 1, picture->alpha) == Status::Ok) {
    for (x = 0; x < picture->width; ++x)
      picture->alpha.StoredRow(0)[static_cast<size_t>(x)] = static_cast<uint8_t>(0x80 + x);
  }
  return picture;
}

TEST(BmpWrite, HeadersOfBothDialects) {
  struct Row {
    const char* name;
    int32_t os2;
    PicturePointer picture;
    size_t size;
    Bytes begin;
    Bytes end;  // rows at the end
  };
  const Row rows[] = {
      {"1 bit", 0, OneRow(1, {1, 0, 1}), 66,
       Hex("424D 42000000 00000000 3E000000  28000000 03000000 01000000 0100 0100 00000000 04000000"
           "00000000 00000000 02000000 02000000  00000000 FFFFFF00"),
       Hex("A0000000")},
      {"3 bits become 4", 0, OneRow(3, {1, 7, 5}), 122,
       Hex("424D 7A000000 00000000 76000000  28000000 03000000 01000000 0100 0400 00000000 04000000"
           "00000000 00000000 10000000 10000000  00000000 55000000 AA000000"),
       Hex("17500000")},
      {"6 bits become 8", 0, OneRow(6, {1, 63}), 1082,
       Hex("424D 3A040000 00000000 36040000  28000000 02000000 01000000 0100 0800 00000000 04000000"
           "00000000 00000000 00010000 00010000  00000000 55000000"),
       Hex("013F0000")},
      {"24 bits", 0, OneRow(24, {0x010203}), 58,
       Hex("424D 3A000000 00000000 36000000  28000000 01000000 01000000 0100 1800 00000000 04000000"
           "00000000 00000000 00000000 00000000"),
       Hex("03020100")},
      {"alpha makes 32 bits", 0, OneRow(24, {0x010203, 0x040506}, true), 62,
       Hex("424D 3E000000 00000000 36000000  28000000 02000000 01000000 0100 2000 00000000 08000000"
           "00000000 00000000 00000000 00000000"),
       Hex("03020180 06050481")},
      {"alpha of an indexed picture stays out", 0, OneRow(8, {1}, true), 1082,
       Hex("424D 3A040000 00000000 36040000  28000000 01000000 01000000 0100 0800"),
       Hex("01000000")},
      {"OS/2, 1 bit", 1, OneRow(1, {0, 1}), 36,
       Hex("424D 24000000 00000000 20000000  0C000000 0200 0100 0100 0100  000000 FFFFFF"),
       Hex("40000000")},
      {"OS/2, 4 bits", 1, OneRow(4, {1, 2}), 78,
       Hex("424D 4E000000 00000000 4A000000  0C000000 0200 0100 0100 0400  000000 550000 AA0000"),
       Hex("12000000")},
      {"OS/2, 8 bits", 1, OneRow(8, {1, 2}), 798,
       Hex("424D 1E030000 00000000 1A030000  0C000000 0200 0100 0100 0800  000000 550000 AA0000"),
       Hex("01020000")},
      {"OS/2 has no alpha", 1, OneRow(24, {0x010203}, true), 30,
       Hex("424D 1E000000 00000000 1A000000  0C000000 0100 0100 0100 1800"), Hex("03020100")},
  };
  const ScopedSettings restore;
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    settings.WriteOS2Bitmaps = row.os2;
    const Bytes file = Encode(BmpWrite, *row.picture);
    ASSERT_EQ(file.size(), row.size);
    EXPECT_THAT(std::span(file).first(row.begin.size()), ElementsAreArray(row.begin));
    EXPECT_THAT(std::span(file).last(row.end.size()), ElementsAreArray(row.end));
  }
}

TEST(BmpWrite, RefusesWhatItCannotStore) {
  const ScopedSettings restore;
  settings.WriteOS2Bitmaps = 1;
  Status status = Status::Ok;
  EXPECT_TRUE(Encode(BmpWrite, *PatternPicture(65536, 1, 1), &status).empty());
  EXPECT_EQ(status, Status::UnsuitableImage);
  EXPECT_TRUE(Encode(BmpWrite, *NewPictureRecord(), &status).empty());
  EXPECT_EQ(status, Status::MemoryAllocationError);

  const PicturePointer picture = PatternPicture(1, 1, 8);
  picture->fileName.AssignCut("/nowhere/a.bmp");
  EXPECT_EQ(BmpWrite(*picture, {}), Status::ErrorCreatingFile);
}

TEST(BmpDetails, LinesOfBothDialects) {
  struct Row {
    const char* name;
    Bytes file;
    std::vector<std::string> lines;
  };
  const Row rows[] = {
      {"Windows",
       Hex("424D 40E20100 00000000 36000000  28000000 D2040000 81FFFFFF 0100 1800 00000000 15CD5B07"
           "130B0000 FFFFFFFF E8030000 FFFFFFFF"),
       {"WINDOWS BITMAP", "            File size: 123,456", "          Header size: 54", "            Info size: 40",
        "                Width: 1,234", "                Depth: -127", "               Planes: 1", "                 Bits: 24",
        "          Compression: 0", "           Image size: 123,456,789", "Horizontal resolution: 2835",
        "  Vertical resolution: 4294967295", "          Colors used: 1,000", "     Colors important: 4,294,967,295"}},
      {"OS/2",
       Os2(65535, 2, 4, std::string(56, '0')),
       {"OS/2 BITMAP", "            File size: 0", "          Header size: 2147483647", "            Info size: 12",
        "                Width: 65,535", "                Depth: 2", "               Planes: 1", "                 Bits: 4"}},
  };
  const TemporaryFolder folder;
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    PictureRecord picture;
    picture.fileName.AssignCut(folder.Path("a.bmp"));
    WriteBytes(folder.Path("a.bmp"), row.file);
    for (int round = 0; round < 2; ++round) {  // a second request replaces the first
      EXPECT_EQ(BmpDetails(picture), Status::Ok);
      std::vector<std::string> lines;
      for (size_t i = 0; i < picture.detailLines.Count(); ++i)
        lines.emplace_back(picture.detailLines.Line(i));
      EXPECT_EQ(lines, row.lines);
    }
  }
}

}  // namespace
}  // namespace fotomill::test
