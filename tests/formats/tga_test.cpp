#include "formats/targa/tga.h"

#include <gtest/gtest.h>

#include "settings/settings.h"
#include "support/codecs.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

TEST(TgaRead, Kinds) {
  struct Row {
    const char* name;
    const char* file;
    Status status;
    const char* pixels;
    const char* alpha;
  };
  const Row rows[] = {
      {"24 bits from the bottom", "00 00 02 0000 0000 00 0000 0000 0100 0200 18 00  010203 040506", Status::Ok, "060504 / 030201",
       ""},
      {"24 bits from the top right", "00 00 02 0000 0000 00 0000 0000 0200 0100 18 30  010203 040506", Status::Ok,
       "060504 030201", ""},
      {"32 bits with alpha", "00 00 02 0000 0000 00 0000 0000 0200 0100 20 08  01020380 04050600", Status::Ok, "030201 060504",
       "128 0"},
      {"32 bits whose alpha is unset everywhere", "00 00 02 0000 0000 00 0000 0000 0100 0100 20 08  01020300", Status::Ok,
       "030201", ""},
      {"32 bits without attribute bits", "00 00 02 0000 0000 00 0000 0000 0100 0100 20 00  01020380", Status::Ok, "030201", ""},
      {"16 bits with one of alpha", "00 00 02 0000 0000 00 0000 0000 0200 0100 10 01  00FC E003", Status::Ok, "FF0000 00FF00",
       "255 0"},
      {"gray", "00 00 03 0000 0000 00 0000 0000 0200 0100 08 00  10 20", Status::Ok, "16 32", ""},
      {"gray and alpha", "00 00 03 0000 0000 00 0000 0000 0100 0100 10 08  10 20", Status::Ok, "101010", "32"},
      {"identification text, map that starts at 2", "02 01 01 0200 0200 18 0000 0000 0200 0100 08 00  4141  0000FF 00FF00  02 03",
       Status::Ok, "2 3", ""},
      {"packets that go on in the next row", "00 00 0B 0000 0000 00 0000 0000 0200 0200 08 20  82 07  00 09", Status::Ok,
       "7 7 / 7 9", ""},
      {"a packet is cut short", "00 00 0A 0000 0000 00 0000 0000 0200 0200 18 20  83 0102", Status::FileReadError, "", ""},
      {"rows are cut short", "00 00 02 0000 0000 00 0000 0000 0200 0200 18 20  010203", Status::FileReadError, "", ""},
      {"no picture", "00 00 00 0000 0000 00 0000 0000 0200 0200 18 20", Status::NoImages, "", ""},
      {"no such type", "00 00 07 0000 0000 00 0000 0000 0200 0200 18 20", Status::DamagedFile, "", ""},
      {"no such depth", "00 00 02 0000 0000 00 0000 0000 0200 0200 09 20", Status::UnsupportedFormat, "", ""},
      {"no height", "00 00 02 0000 0000 00 0000 0000 0200 0000 18 20", Status::DamagedFile, "", ""},
      {"65535 x 65535 in 18 bytes", "00 00 0A 0000 0000 00 0000 0000 FFFF FFFF 20 20", Status::FileReadError, "", ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(TgaRead, Hex(row.file));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

TEST(TgaWrite, Layouts) {
  const ScopedSettings scoped;
  const PicturePointer picture = PatternPicture(2, 1, 24);
  SetPixel(picture->image, 0, 0, 0xFF8040);
  SetPixel(picture->image, 1, 0, 0x0000FF);
  const std::string footer = "00000000 00000000 54525545564953494F4E2D5846494C45 2E00";
  EXPECT_EQ(Encode(TgaWrite, *picture), Hex("00 00 02 0000 0000 00 00000000 0200 0100 18 00  4080FF FF0000 " + footer));
  settings.CreateTarga16 = 1;
  EXPECT_EQ(Encode(TgaWrite, *picture), Hex("00 00 02 0000 0000 00 00000000 0200 0100 10 00  087E 1F00 " + footer));
}

}  // namespace
}  // namespace fotomill::test
