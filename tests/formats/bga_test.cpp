#include "formats/bmp/bga.h"

#include <gtest/gtest.h>

#include "formats/bmp/bmp.h"
#include "formats/bmp/rle.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// An array header with its successor at `next`.
std::string Array(const char* next = "00000000") {
  return std::string("4241 28000000 ") + next + " 0000 0000  ";
}
// A file header, and a 12-byte information header.
std::string Header(const char* kind, const char* pixels, const char* sizeAndBits) {
  return std::string(kind) + " 1A000000 0000 0000 " + pixels + "  0C000000 " + sizeAndBits + "  ";
}
const std::string kBitmap = "424D", kIcon = "4943", kPointer = "5054", kColorIcon = "4349";
const std::string kTwoColors = "000000 FFFFFF  ";

// Decodes one page of the file.
Decoded ReadPage(const std::string& hex, int32_t page) {
  const TemporaryFolder folder;
  WriteBytes(folder.Path("a.bga"), Hex(hex));
  Decoded result{Status::Ok, NewPictureRecord()};
  ReadRequest request = RequestFor(folder.Path("a.bga"));
  request.page = page;
  result.status = BgaRead(*result.picture, request);
  return result;
}

TEST(Bga, ReadsItsEntries) {
  // 40 bytes of headers, two colors: pixels at 46.
  const std::string mono = Array() + Header("424D", "2E000000", "0300 0200 0100 0100") +
                           kTwoColors + "20 000000  A0 000000";
  const std::string bare = Header("424D", "1A000000", "0100 0100 0100 1800") + "010203 00";
  // Masks of 2 x 4 at 84, colors of 2 x 2 at 100; the upper half of the masks hides the top left.
  const std::string icon = Array() + Header("4349", "60000000", "0200 0400 0100 0100") +
                           kTwoColors + Header("4349", "70000000", "0200 0200 0100 1800") + "" +
                           std::string(48, '0') + "00000000 00000000 00000000 80000000" +
                           "010101 020202 0000  030303 040404 0000";
  // As above, without color: the lower half has the colors, the upper one hides the lower right.
  const std::string pointer = Array() +
                              "5054 1A000000 0100 0000 2E000000  0C000000 0200 0400 0100 0100 " +
                              kTwoColors + "80000000 40000000 40000000 00000000";
  const std::string coded =
      Array() +
      "424D 36000000 0000 0000 4C000000  28000000 03000000 01000000 0100 0800 "
      "01000000 00000000 00000000 00000000 02000000 00000000 " +
      "00000000 FFFFFF00 02 01 01 00 0001";
  const struct {
    const char* name;
    std::string file;
    Status status;
    const char* pixels;
  } rows[] = {
      {"two colors", mono, Status::Ok, "1 0 1 / 0 0 1"},
      {"a bitmap without array", bare, Status::Ok, "030201"},
      {"a color icon", icon, Status::Ok, "030303 040404 / 010101 020202"},
      {"a pointer", pointer, Status::Ok, "000000 FFFFFF / FFFFFF 000000"},
      {"runs", coded, Status::Ok, "1 1 0"},
      {"no such array", "4243 00000000 00000000 00000000", Status::DamagedFile, ""},
      {"pixels cut short", mono.substr(0, mono.size() - 2), Status::FileReadError, ""},
      {"an entry of another kind", Array() + Header("5858", "2E000000", "0300 0200 0100 0100"),
       Status::DamagedFile, ""},
      {"a depth that none has", Array() + Header("424D", "2E000000", "0300 0200 0100 0500"),
       Status::UnsupportedFormat, ""},
      {"a header of 13 bytes",
       Array() + "424D 1A000000 0000 0000 2E000000  0D000000 0300 0200 0100 0100",
       Status::DamagedFile, ""},
      {"no array header", "4241 28000000 00", Status::FileReadError, ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = ReadPage(row.file, 0);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
  }
  EXPECT_EQ(PixelText(ReadPage(icon, 0).picture->alpha), "0 255 / 255 255");
  const Decoded hot = ReadPage(pointer, 0);
  EXPECT_EQ(PixelText(hot.picture->alpha), "255 255 / 255 0");
  EXPECT_EQ(hot.picture->hotSpotX, 1);
  EXPECT_EQ(hot.picture->hotSpotY, 1);
}

TEST(Bga, StopsAtBackwardLinks) {
  const std::string first = Header("424D", "5C000000", "0100 0100 0100 1800"),
                    second = Header("424D", "60000000", "0100 0100 0100 1800"),
                    pixels = "030201 00  060504 00";
  const std::string file =
      Array("28000000") + first + Array("28000000") + second + std::string(24, '0') + pixels;
  Decoded page = ReadPage(file, 1);
  ASSERT_EQ(page.status, Status::Ok);
  EXPECT_EQ(page.picture->pageCount, 2);
  EXPECT_EQ(PixelText(page.picture->image), "040506");
  EXPECT_EQ(PixelText(ReadPage(file, 0).picture->image), "010203");
  EXPECT_EQ(ReadPage(file, 2).status, Status::NoImages);
}

TEST(Bga, WritesAnArrayOfOneBitmap) {
  const PicturePointer picture = PatternPicture(2, 1, 1);
  SetPixel(picture->image, 0, 0, 1);
  SetPixel(picture->image, 1, 0, 0);
  EXPECT_EQ(
      Encode(BgaWrite, *picture),
      Hex(Array() + Header("424D", "2E000000", "0200 0100 0100 0100") + kTwoColors + "80 000000"));
  const PicturePointer color = PatternPicture(1, 1, 24);
  SetPixel(color->image, 0, 0, 0x010203);
  ASSERT_EQ(NewAlphaPlane(1, 1, color->alpha), Status::Ok);
  color->alpha.Row(0)[0] = 77;
  const Bytes file = Encode(BgaWrite, *color);
  EXPECT_EQ(Bytes(file.end() - 4, file.end()), Hex("030201 4D"));
  const Decoded back = Decode(BgaRead, file);
  EXPECT_EQ(PixelText(back.picture->alpha), "77");
  color->alpha.Row(0)[0] = 0;  // all zeros are not alpha
  EXPECT_TRUE(Decode(BgaRead, Encode(BgaWrite, *color)).picture->alpha.Empty());
  const PicturePointer wide = PatternPicture(65536, 1, 8);
  EXPECT_TRUE(SamePixels(Decode(BgaRead, Encode(BgaWrite, *wide)).picture->image, wide->image));
}

TEST(Rle, EncodesRunsAndLiterals) {
  const struct {
    const char* name;
    std::vector<int> pixels;
    const char* code;
  } rows[] = {
      {"a run", {7, 7, 7, 7, 7}, "05 07"},
      {"a run of three is plain", {1, 7, 7, 7, 2}, "00 05 01 07 07 07 02 00"},
      {"plain pixels of an even count", {1, 2, 3, 4}, "00 04 01 02 03 04"},
      {"two are too few", {1, 2}, "01 01 01 02"},
      {"between runs", {9, 9, 9, 9, 5, 8, 8, 8, 8}, "04 09 01 05 04 08"},
      {"256 equal ones", std::vector<int>(256, 3), "FF 03 01 03"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const auto width = static_cast<int32_t>(row.pixels.size());
    const PicturePointer picture = PatternPicture(width, 1, 8);
    for (int32_t x = 0; x < width; ++x)
      SetPixel(picture->image, x, 0, row.pixels[static_cast<size_t>(x)]);
    const Bytes file = Encode(RleWrite, *picture);
    ASSERT_GT(file.size(), 1078u);
    EXPECT_EQ(Bytes(file.begin() + 1078, file.end()), Hex(std::string(row.code) + " 00 00 00 01"));
    EXPECT_EQ(file[2] | file[3] << 8, static_cast<int>(file.size()));
    EXPECT_EQ(file[34] | file[35] << 8, static_cast<int>(file.size()) - 1078);
    EXPECT_TRUE(SamePixels(Decode(BmpRead, file).picture->image, picture->image));
  }
  Status status = Status::Ok;
  EXPECT_TRUE(Encode(RleWrite, *PatternPicture(3, 3, 24), &status).empty());
  EXPECT_EQ(status, Status::TooManyColors);
}

}  // namespace
}  // namespace fotomill::test
