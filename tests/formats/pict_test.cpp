#include "formats/pict/pict.h"

#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

// A version 2 picture with 1 row and 2 columns, without the preamble.
const std::string kHead =
    "0000 0000 0000 0001 0002  0011 02FF  0C00 FFFE 0000 00480000 00480000 0000 0000 0001 0002 "
    "00000000 ";
const std::string kSquares = " 0000 0000 0001 0002  0000 0000 0001 0002  0000 ";

// A direct pixel map: row size and pack type, then bits and components.
std::string Direct(const char* rowBytes, const char* packType, const char* bits,
                   const char* parts) {
  return std::string(" 009A 000000FF ") + rowBytes + " 0000 0000 0001 0002 0000 " + packType +
         " 00000000 00480000 00480000 0010 " + bits + " " + parts +
         " 0008 00000000 00000000 00000000 " + kSquares;
}

TEST(PictRead, Kinds) {
  const std::string map =
      " 0098 8008 0000 0000 0001 0002 0000 0000 00000000 00480000 00480000 0000 0008 0001 0008 "
      "00000000 00000000 00000000"
      " 00000000 0000 0001  0000 1111 2222 3333  0001 4444 5555 6666 " +
      kSquares;
  struct Row {
    const char* name;
    std::string file;
    Status status;
    const char* pixels;
  };
  const Row rows[] = {
      {"32 bits, packed by colors", kHead + Direct("8008", "0004", "0020", "0003") + "07 05 01 02 03 04 05 06 00FF", Status::Ok,
       "010305 020406"},
      {"with a fourth part", kHead + Direct("8008", "0004", "0020", "0004") + "09 07 FF FF 01 02 03 04 05 06 00FF", Status::Ok,
       "010305 020406"},
      {"32 bits, not packed", kHead + Direct("8008", "0001", "0020", "0003") + "00 010203 00 040506 00FF", Status::Ok, "010203 040506"},
      {"without the fourth byte", kHead + Direct("8008", "0002", "0020", "0003") + "010203 040506 00FF", Status::Ok, "010203 040506"},
      {"16 bits, too short to be packed", kHead + Direct("8004", "0003", "0010", "0003") + "7C00 001F 00FF", Status::Ok, "FF0000 0000FF"},
      {"colors, packed", kHead + map + "05 01 01 00 FB 00 00FF", Status::Ok, "1 0"},
      {"shapes are passed over", kHead + " 0030 0000 0000 0001 0002 " + Direct("8008", "0002", "0020", "0003") + "010203 040506 00FF",
       Status::Ok, "010203 040506"},
      {"version 1, a bitmap", "0000 0000 0000 0001 0002 1101 90 0002 0000 0000 0001 0002" + kSquares + "8000 FF", Status::Ok, "1 0"},
      {"only shapes", kHead + " 0030 0000 0000 0001 0002 00FF", Status::NoImages, ""},
      {"8 bits of direct pixels", kHead + Direct("8008", "0001", "0018", "0003") + "0000000000000000 00FF", Status::UnsupportedFormat, ""},
      {"rows cut short", kHead + Direct("8008", "0004", "0020", "0003") + "07 05 01", Status::FileReadError, ""},
      {"code that ends early", kHead + Direct("8008", "0004", "0020", "0003") + "02 01 01 02 00FF", Status::DamagedFile, ""},
      {"something else", "0000 0000 0000 0001 0002 1102 0000", Status::DamagedFile, ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(PictRead, Hex(row.file.c_str()));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
  }
}

// Two bitmaps side by side: each is scaled to its rectangle.
TEST(PictRead, BitmapsShareTheFrame) {
  const auto piece = [](const char* columns, const char* pixel) {
    return std::string(
               " 009A 000000FF 8004 0000 0000 0001 0001 0000 0001 00000000 00480000 00480000 0010 "
               "0020 0003 0008 00000000 00000000"
               " 00000000 0000 0000 0001 0001 ") +
           "0000 " + std::string(columns, 4) + " 0001 " + (columns + 5) + " 0000 00" + pixel;
  };
  const std::string file =
      kHead + piece("0000 0001", "010203") + piece("0001 0002", "040506") + " 00FF";
  const Decoded decoded = Decode(PictRead, Hex(file.c_str()));
  EXPECT_EQ(decoded.status, Status::Ok);
  EXPECT_EQ(PixelText(decoded.picture->image), "010203 040506");
}

}  // namespace
}  // namespace fotomill::test
