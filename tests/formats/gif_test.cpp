#include "formats/gif/gif.h"

#include <gtest/gtest.h>

#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// Four colors: 000000 FF0000 00FF00 0000FF.
constexpr const char* kPalette = "000000 FF0000 00FF00 0000FF ";
// LZW of 2-bit pixels: clear, 1 2 / 3 0, end.
constexpr const char* kFourPixels = "02 03 8C 06 05 00 ";

Bytes Gif(const std::string& screen, const std::string& blocks) {
  return Hex("474946383961" + screen + blocks + "3B");
}

TEST(GifRead, Frames) {
  const std::string screen = "0200 0200 81 00 00 " + std::string(kPalette);
  const std::string place = "2C 0000 0000 0200 0200 ";
  struct Row {
    const char* name;
    Bytes file;
    Status status;
    const char* pixels;
    const char* alpha;
  };
  const Row rows[] = {
      {"palette of four", Gif(screen, place + "00 " + kFourPixels), Status::Ok, "1 2 / 3 0", ""},
      {"a transparent index becomes alpha",
       Gif(screen, "21 F9 04 01 0000 02 00 " + place + "00 " + kFourPixels), Status::Ok,
       "FF0000 000000 / 0000FF 000000", "255 0 / 255 255"},
      {"local palette", Gif("0200 0200 00 00 00", place + "81 " + kPalette + kFourPixels),
       Status::Ok, "1 2 / 3 0", ""},
      {"no palette reads as grays", Gif("0200 0200 00 00 00", place + "00 " + kFourPixels),
       Status::Ok, "1 2 / 3 0", ""},
      {"a frame smaller than the screen",
       Gif("0300 0200 81 00 00 " + std::string(kPalette),
           "2C 0100 0000 0200 0200 00 " + std::string(kFourPixels)),
       Status::Ok, "000000 FF0000 00FF00 / 000000 0000FF 000000", "0 255 255 / 0 255 255"},
      {"a frame beyond the screen is cut",
       Gif("0200 0200 81 00 00 " + std::string(kPalette),
           "2C 0100 0100 0200 0200 00 " + std::string(kFourPixels)),
       Status::Ok, "000000 000000 / 000000 FF0000", "0 0 / 0 255"},
      {"a screen without size",
       Gif("0000 0000 81 00 00 " + std::string(kPalette), place + "00 " + kFourPixels), Status::Ok,
       "1 2 / 3 0", ""},
      {"stray bytes and unknown extensions",
       Gif(screen, "00 21 42 02 AA BB 00 00 " + place + "00 " + kFourPixels), Status::Ok,
       "1 2 / 3 0", ""},
      {"no end code", Gif(screen, place + "00 02 02 8C 06 00"), Status::Ok, "1 2 / 3 0", ""},
      {"pixels are missing", Gif(screen, place + "00 02 01 8C 00"), Status::FileReadError, "", ""},
      {"a code that cannot be", Gif(screen, place + "00 02 01 3C 00"), Status::DamagedFile, "", ""},
      {"no picture", Gif(screen, ""), Status::NoImages, "", ""},
      {"an empty frame", Gif(screen, "2C 0000 0000 0000 0200 00 02 00"), Status::DamagedFile, "",
       ""},
      {"codes wider than the pixels", Gif(screen, place + "00 09 08 00 06 20 C0 00 00 04 08 00"),
       Status::Ok, "1 2 / 3 0", ""},
      {"pixels of 13 bits", Gif(screen, place + "00 0D 01 00 00"), Status::DamagedFile, "", ""},
      {"not a GIF", Hex("4749463838610200020000"), Status::DamagedFile, "", ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(GifRead, row.file);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

TEST(GifRead, ComposesFrames) {
  // Two by one: red red, then a green pixel on the right with each disposal, then a blue one
  // on the left.
  const auto file = [](const char* disposal) {
    return Gif("0200 0100 81 00 00 " + std::string(kPalette),
               "2C 0000 0000 0200 0100 00 02 02 4C 0A 00 "
               "21 F9 04 " +
                   std::string(disposal) +
                   " 0000 00 00 2C 0100 0000 0100 0100 00 02 02 54 01 00 "
                   "21 F9 04 00 0000 00 00 2C 0000 0000 0100 0100 00 02 02 5C 01 00 ");
  };
  struct Row {
    const char* disposal;
    const char* pixels;
    const char* alpha;
  };
  const Row rows[] = {
      {"04", "0000FF 00FF00", "255 255"},  // kept
      {"08", "0000FF 000000", "255 0"},    // cleared
      {"0C", "0000FF FF0000", "255 255"},  // restored
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.disposal);
    TemporaryFolder folder;
    WriteBytes(folder.Path("a.gif"), file(row.disposal));
    const PicturePointer picture = NewPictureRecord();
    ReadRequest request{.fileName = folder.Path("a.gif"), .page = 2};
    ASSERT_EQ(GifRead(*picture, request), Status::Ok);
    EXPECT_EQ(PixelText(picture->image), row.pixels);
    EXPECT_EQ(PixelText(picture->alpha), row.alpha);
    request.page = 3;
    EXPECT_EQ(GifRead(*picture, request), Status::NoImages);
  }
}

TEST(GifWrite, LongStringsAndFullTablesRoundTrip) {
  const ScopedSettings scoped;
  for (const bool interlaced : {false, true}) {
    settings.WriteGIFInterlaced = interlaced;
    for (const int32_t bits : {1, 4, 8}) {
      SCOPED_TRACE(std::to_string(bits) + (interlaced ? " interlaced" : ""));
      const PicturePointer picture = PatternPicture(257, 211, bits);
      // noise fills the table several times, the flat part creates strings of thousands of bytes
      uint32_t seed = 1;
      for (int32_t y = 0; y < 150; ++y) {
        for (int32_t x = 0; x < 257; ++x) {
          seed = seed * 1664525 + 1013904223;
          SetPixel(picture->image, x, y, static_cast<int32_t>(seed >> 24) & ((1 << bits) - 1));
        }
      }
      const Bytes file = Encode(GifWrite, *picture);
      const Decoded back = Decode(GifRead, file);
      ASSERT_EQ(back.status, Status::Ok);
      EXPECT_TRUE(SamePixels(picture->image, back.picture->image));
    }
  }
}

TEST(GifWrite, FewPixels) {
  const ScopedSettings scoped;
  const PicturePointer picture = PatternPicture(2, 1, 1);
  SetPixel(picture->image, 0, 0, 1);
  SetPixel(picture->image, 1, 0, 0);
  settings.CreateGif89 = 0;
  EXPECT_EQ(Encode(GifWrite, *picture), Hex(R"(474946383761   # GIF87a
      0200 0100 80 00 00  000000 FFFFFF
      2C 0000 0000 0200 0100 00
      02  02 0C 0A  00                       # clear, 1, 0, end in codes of 3 bits
      3B)"));
  settings.CreateGif89 = 1;
  picture->comment = {'h', 'i'};
  const Bytes file = Encode(GifWrite, *picture);
  EXPECT_EQ(Bytes(file.begin() + 19, file.begin() + 25), Hex("21 FE 02 68 69 00"));
  Status status = Status::Ok;
  EXPECT_TRUE(Encode(GifWrite, *PatternPicture(2, 2, 24), &status).empty());
  EXPECT_EQ(status, Status::TooManyColors);
}

}  // namespace
}  // namespace fotomill::test
