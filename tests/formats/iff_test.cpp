#include "formats/amiga/iff.h"

#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

const std::string kIlbm = "464F524D 00000000 494C424D ", kPbm = "464F524D 00000000 50424D20 ";
const std::string kColors = " 434D4150 0000000C  000000 102030 405060 FFFFFF ";

// A header: columns and rows, then planes, masking and compression, then the transparent color.
std::string Header(const char* size, const char* kind, const char* transparent = "0000") {
  return std::string(" 424D4844 00000014 ") + size + " 00000000 " + kind + " 00 " + transparent +
         " 0101 00000000 ";
}
std::string Mode(const char* mode) { return std::string(" 43414D47 00000004 ") + mode + " "; }
std::string Body(const char* size, const char* data) {
  return std::string(" 424F4459 ") + size + " " + data;
}

TEST(IffRead, Variants) {
  const std::string two = Header("0003 0001", "02 00 00");
  const std::string hamRow = Body("0000000C", "8000 4000 0000 0000 4000 0000");
  struct Row {
    const char* name;
    std::string file;
    Status status;
    const char* pixels;
    const char* alpha;
  };
  const Row rows[] = {
      {"two planes", kIlbm + two + kColors + Body("00000004", "A000 6000"), Status::Ok, "1 2 3",
       ""},
      {"an unknown chunk of odd size",
       kIlbm + " 78787878 00000001 00 00 " + two + kColors + Body("00000004", "A000 6000"),
       Status::Ok, "1 2 3", ""},
      {"ByteRun1",
       kIlbm + Header("0003 0001", "02 00 01") + kColors + Body("00000004", "FF A0 FF 60"),
       Status::Ok, "1 2 3", ""},
      {"a run over two planes",
       kIlbm + Header("0003 0001", "02 00 01") + kColors + Body("00000002", "FD A0"), Status::Ok,
       "3 0 3", ""},
      {"a mask of its own",
       kIlbm + Header("0003 0001", "02 01 00") + kColors + Body("00000006", "A000 6000 4000"),
       Status::Ok, "1 2 3", "0 255 0"},
      {"a transparent color",
       kIlbm + Header("0003 0001", "02 02 00", "0002") + kColors + Body("00000004", "A000 6000"),
       Status::Ok, "1 2 3", "255 0 255"},
      {"24 planes",
       kIlbm + Header("0001 0001", "18 00 00") +
           Body("00000030",
                "8000 0000 0000 0000 0000 0000 0000 0000  0000 8000 0000 0000 0000 0000 0000 0000"
                "  8000 8000 0000 0000 0000 0000 0000 0000"),
       Status::Ok, "010203", ""},
      {"PBM, rows of even size",
       kPbm + Header("0003 0002", "08 00 00") + Body("00000008", "01 02 03 00 04 05 06 00"),
       Status::Ok, "1 2 3 / 4 5 6", ""},
      {"PBM of two planes",
       kPbm + Header("0003 0001", "02 00 00") + Body("00000004", "01 02 03 00"),
       Status::UnsupportedFormat, "", ""},
      {"hold and modify: a color, then its blue",
       kIlbm + Header("0003 0001", "06 00 00") + kColors + Mode("00000800") + hamRow, Status::Ok,
       "102030 102022 000000", ""},
      {"another compression",
       kIlbm + Header("0003 0001", "02 00 02") + Body("00000004", "A000 6000"),
       Status::UnsupportedFormat, "", ""},
      {"twelve planes", kIlbm + Header("0003 0001", "0C 00 00") + Body("00000004", "A000 6000"),
       Status::UnsupportedFormat, "", ""},
      {"another kind of file", "464F524D 00000000 38535658 00000000", Status::UnsupportedFormat, "",
       ""},
      {"no pixels", kIlbm + two, Status::NoImages, "", ""},
      {"no header", kIlbm + Body("00000004", "A000 6000"), Status::DamagedFile, "", ""},
      {"no columns", kIlbm + Header("0000 0001", "02 00 00") + Body("00000004", "A000 6000"),
       Status::DamagedFile, "", ""},
      {"cut short", kIlbm + two + Body("00000004", "A000"), Status::FileReadError, "", ""},
      {"65535 x 65535 in little",
       kIlbm + Header("FFFF FFFF", "08 00 01") + Body("00000004", "A000 6000"),
       Status::FileReadError, "", ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(IffRead, Hex(row.file.c_str()));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

TEST(IffRead, PalettesOfOldPrograms) {
  // 4-bit colors in the high half, and extra half-bright without a screen mode.
  const std::string nibbles = " 434D4150 00000006  F02000 804000 ";
  const Decoded old = Decode(
      IffRead,
      Hex((kIlbm + Header("0001 0001", "01 00 00") + nibbles + Body("00000002", "8000")).c_str()));
  ASSERT_EQ(old.status, Status::Ok);
  EXPECT_EQ(old.picture->palette[0], 0xff);
  EXPECT_EQ(old.picture->palette[4], 0x44);
  std::string colors = " 434D4150 00000060 ";
  for (int i = 0; i < 32; ++i) colors += "FF8041";
  const std::string body = Body("0000000C", "8000 0000 0000 0000 0000 8000");
  const Decoded half =
      Decode(IffRead, Hex((kIlbm + Header("0001 0001", "06 00 00") + colors + body).c_str()));
  ASSERT_EQ(half.status, Status::Ok);
  EXPECT_EQ(PixelText(half.picture->image), "33");
  EXPECT_EQ(half.picture->palette[99], 0x7f);
}

TEST(IffWrite, FollowsItsKeys) {
  const ScopedSettings scope;
  const PicturePointer picture = PatternPicture(33, 5, 4);
  const auto kindOf = [&] {
    const Bytes file = Encode(IffWrite, *picture);
    EXPECT_EQ(Decode(IffRead, file).status, Status::Ok);
    return std::string(file.begin() + 8, file.begin() + 12) + " " + std::to_string(file[28]) + " " +
           std::to_string(file[30]);
  };
  EXPECT_EQ(kindOf(), "ILBM 4 1");
  settings.CreateIffCompressed = 0;
  EXPECT_EQ(kindOf(), "ILBM 4 0");
  settings.CreateIffPBM = 1;
  EXPECT_EQ(kindOf(), "PBM  8 0");
  // The padding of odd rows repeats the last pixel.
  picture->image.Row(4)[16] = 0x90;  // two pixels per byte
  const Bytes file = Encode(IffWrite, *picture);
  EXPECT_EQ(Bytes(file.end() - 2, file.end()), Hex("09 09"));
}

// HAM rows start with the first color; some readers assume black.
TEST(IffWrite, FirstColorOfHamIsBlack) {
  const Bytes file = Encode(HamWrite, *PatternPicture(33, 5, 24));
  const std::string_view text(reinterpret_cast<const char*>(file.data()), file.size());
  const size_t place = text.find("CMAP");
  ASSERT_NE(place, std::string_view::npos);
  EXPECT_EQ(text.substr(place + 8, 3), std::string_view("\0\0\0", 3));
}

}  // namespace
}  // namespace fotomill::test
