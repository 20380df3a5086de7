#include "formats/photoshop/psd.h"

#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

const std::string kNoTable = " 00000000", kNoResources = " 00000000", kNoLayers = " 00000000",
                  kPlain = " 0000 ";

// A header with channels, rows, columns, bits and mode.
std::string Head(const char* fields) { return std::string("38425053 0001 000000000000 ") + fields; }
std::string Flat(const char* fields) { return Head(fields) + kNoTable + kNoResources + kNoLayers; }

TEST(PsdRead, Kinds) {
  const std::string gray = Flat("0001 00000001 00000003 0008 0001"),
                    rgb = Flat("0003 00000001 00000002 0008 0003");
  const std::string rgba = Flat("0004 00000001 00000001 0008 0003"),
                    cmyk = Flat("0004 00000001 00000002 0008 0004");
  const std::string indexed = Head("0001 00000001 00000002 0008 0002") + " 00000300" + " 01 02" +
                              std::string(2 * 254, '0') + " 03 04" + std::string(2 * 254, '0') +
                              " 05 06" + std::string(2 * 254, '0');
  const std::string transparent = " 0000000E 3842494D 0417 0000 00000002 0001";
  const std::string inkExtra = " 0000001A 3842494D 03EF 0000 0000000E 0000000000000000000000000200";
  const std::string oneLayer =
      "00000000 00000000 00000001 00000001 0000 3842494D 6E6F726D FF 00 00 00 00000000";
  const std::string opaque = " 0000002E 00000026 0001 " + oneLayer + " 0000 00000000";
  const std::string seeThrough = " 0000002E 00000026 FFFF " + oneLayer + " 0000 00000000";
  struct Row {
    const char* name;
    std::string file;
    Status status;
    const char* pixels;
    const char* alpha;
  };
  const Row rows[] = {
      {"bitmap, a set bit is black", Flat("0001 00000001 00000003 0001 0000") + kPlain + "A0",
       Status::Ok, "1 0 1", ""},
      {"gray", gray + kPlain + "01 02 03", Status::Ok, "1 2 3", ""},
      {"gray in PackBits", gray + " 0001 0002  FE 07", Status::Ok, "7 7 7", ""},
      {"PackBits beyond the row", gray + " 0001 0002  F0 07", Status::Ok, "7 7 7", ""},
      {"PackBits that end early", gray + " 0001 0002  FF 07", Status::DamagedFile, "", ""},
      {"rows behind the end", gray + " 0001 0009  FE 07", Status::FileReadError, "", ""},
      {"gray in deflate of differences", gray + " 0003 789C636464040000090004", Status::Ok, "1 2 3",
       ""},
      {"16 bits, rounded", Flat("0001 00000001 00000003 0010 0001") + kPlain + "0080 0081 FFFF",
       Status::Ok, "0 1 255", ""},
      {"duotone as gray", Flat("0001 00000001 00000002 0008 0008") + kPlain + "01 02", Status::Ok,
       "1 2", ""},
      {"RGB in planes", rgb + kPlain + "01 02 03 04 05 06", Status::Ok, "010305 020406", ""},
      {"a fourth channel is alpha", rgba + kPlain + "01 02 03 80", Status::Ok, "010203", "128"},
      {"but not a spot color",
       Head("0004 00000001 00000001 0008 0003") + kNoTable + inkExtra + kNoLayers + kPlain +
           "01 02 03 80",
       Status::Ok, "010203", ""},
      {"nor beside an opaque picture of layers",
       Head("0004 00000001 00000001 0008 0003") + kNoTable + kNoResources + opaque + kPlain +
           "01 02 03 80",
       Status::Ok, "010203", ""},
      {"colors on white where layers leave gaps",
       Head("0004 00000001 00000001 0008 0003") + kNoTable + kNoResources + seeThrough + kPlain +
           "FF 80 7F 80",
       Status::Ok, "FF0200", "128"},
      {"CMYK without a profile", cmyk + kPlain + "FF 00 FF FF FF FF FF 80", Status::Ok,
       "FFFFFF 008080", ""},
      {"three inks of a multichannel picture",
       Flat("0003 00000001 00000001 0008 0007") + kPlain + "01 02 03", Status::Ok, "010203", ""},
      {"Lab", Flat("0003 00000001 00000002 0008 0009") + kPlain + "00 FF 80 80 80 80", Status::Ok,
       "000000 FFFFFF", ""},
      {"indexed", indexed + kNoResources + kNoLayers + kPlain + "00 01", Status::Ok, "0 1", ""},
      {"indexed with a transparent color", indexed + transparent + kNoLayers + kPlain + "00 01",
       Status::Ok, "0 1", "255 0"},
      {"a table that is too short",
       Head("0001 00000001 00000001 0008 0002") + " 00000003 01 02 03" + kNoResources + kNoLayers +
           kPlain + "00",
       Status::DamagedFile, "", ""},
      {"neither merged picture nor layers", gray, Status::NoImages, "", ""},
      {"pixels cut short", gray + kPlain + "01 02", Status::FileReadError, "", ""},
      {"another compression", gray + " 0004 00", Status::UnsupportedFormat, "", ""},
      {"32 bits a sample", Flat("0001 00000001 00000001 0020 0001") + kPlain + "00000000",
       Status::UnsupportedFormat, "", ""},
      {"a large document", "38425053 0002 000000000000 0001 00000001 00000001 0008 0001 00000000",
       Status::UnsupportedFormat, "", ""},
      {"fewer channels than RGB has", Flat("0002 00000001 00000001 0008 0003") + kPlain + "01 02",
       Status::DamagedFile, "", ""},
      {"huge in 38 bytes", Flat("0001 7FFFFFFF 7FFFFFFF 0008 0001") + " 0001 0000",
       Status::FileReadError, "", ""},
      {"resources beyond the end",
       Head("0001 00000001 00000001 0008 0001") + kNoTable + " 7FFFFFFF 00", Status::FileReadError,
       "", ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(PsdRead, Hex(row.file.c_str()));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

// A gray picture of 2 x 1 without a merged picture: a layer that extends beyond the left edge.
TEST(PsdRead, LayersWithoutAMergedPicture) {
  const std::string sides = "00000000 FFFFFFFF 00000001 00000001";
  const std::string layer =
      sides + " 0002 0000 00000004 FFFF 00000004 3842494D 6E6F726D FF 00 00 00 00000000";
  const std::string data = " 0000 05 06  0000 70 80";
  const std::string section = " 0000003E 0000003A 0001 " + layer + data + " 0000";
  const Decoded decoded = Decode(
      PsdRead,
      Hex((Head("0001 00000001 00000002 0008 0001") + kNoTable + kNoResources + section).c_str()));
  EXPECT_EQ(decoded.status, Status::Ok);
  EXPECT_EQ(decoded.picture->pageCount, 1);
  EXPECT_EQ(PixelText(decoded.picture->image), "6 0");
  EXPECT_EQ(PixelText(decoded.picture->alpha), "128 0");
}

TEST(PsdWrite, MetadataRoundTrips) {
  const PicturePointer picture = PatternPicture(5, 3, 24);
  picture->metadata.icc = {1, 2, 3};
  picture->metadata.exif = {4, 5};
  picture->metadata.xmp = {6};
  picture->metadata.dpiX = 300;
  picture->metadata.dpiY = 150;
  const Decoded back = Decode(PsdRead, Encode(PsdWrite, *picture));
  EXPECT_EQ(back.status, Status::Ok);
  EXPECT_EQ(back.picture->metadata.icc, picture->metadata.icc);
  EXPECT_EQ(back.picture->metadata.exif, picture->metadata.exif);
  EXPECT_EQ(back.picture->metadata.xmp, picture->metadata.xmp);
  EXPECT_EQ(back.picture->metadata.dpiX, 300);
  EXPECT_EQ(back.picture->metadata.dpiY, 150);
}

}  // namespace
}  // namespace fotomill::test
