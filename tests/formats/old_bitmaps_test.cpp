#include <gtest/gtest.h>

#include "formats/cals/cals.h"
#include "formats/hrz/hrz.h"
#include "formats/mspaint/msp.h"
#include "formats/sunraster/ras.h"
#include "formats/wbmp/wbmp.h"
#include "support/codecs.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

struct ReadRow {
  const char* name;
  ReadOperation read;
  const char* file;
  Status status;
  const char* pixels;
};

TEST(OldBitmaps, ReadsOldVariants) {
  const std::string ras8 = "59A66A95 00000003 00000002 00000008 00000000 ",
                    ras24 = "59A66A95 00000001 00000001 00000018 00000000 ";
  const std::string plainMap = "00000001 00000000 00000000 ", coded = "00000002 00000000 00000000 ";
  const std::string rest = " 0000 0000 0000 0000 0000 0000 0000 0000 0000 0000 0000 0000";
  const std::string gray = ras8 + plainMap + "01 02 03 00  04 05 06 00";
  const std::string runs = ras8 + coded + "80 04 09 80 00 01 07";
  const std::string mapped =
      ras8 + "00000001 00000001 00000006  10 20  30 40  50 60  00 01 00 00  01 01 01 00";
  const std::string blueFirst = ras24 + plainMap + "03 02 01 00",
                    redFirst = ras24 + "00000003 00000000 00000000 01 02 03 00";
  const std::string cut = ras24 + plainMap + "03 02";
  const std::string paint1 = "44616E4D 0900 0200" + rest + "FF 80  00 00";
  const std::string paint2 = "4C696E53 1800 0300" + rest + "0300 0000 0300  00 03 55  02 01 02";
  const ReadRow rows[] = {
      {"Sun raster, rows padded to 16 bits", RasRead, gray.c_str(), Status::Ok, "1 2 3 / 4 5 6"},
      {"Sun raster, runs over the end of a row, 128 itself", RasRead, runs.c_str(), Status::Ok, "9 9 9 / 9 128 1"},
      {"Sun raster, planes of a map", RasRead, mapped.c_str(), Status::Ok, "0 1 0 / 1 1 1"},
      {"Sun raster, blue first", RasRead, blueFirst.c_str(), Status::Ok, "010203"},
      {"Sun raster, red first", RasRead, redFirst.c_str(), Status::Ok, "010203"},
      {"Sun raster, cut short", RasRead, cut.c_str(), Status::FileReadError, ""},
      {"WBMP, sizes of two bytes", WbmpRead, "00 00 81 01 01  80 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 80", Status::Ok,
       "1 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 "
       "0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 0 "
       "0 0 0 0 0 0 0 1"},
      {"WBMP, a size of 35 bits", WbmpRead, "00 00 FF FF FF FF 7F 01", Status::DamagedFile, ""},
      {"WBMP, further headers", WbmpRead, "00 80 01 01 80", Status::DamagedFile, ""},
      {"WBMP, another type", WbmpRead, "01 00 01 01 80", Status::UnsupportedFormat, ""},
      {"Paint 1", MspRead, paint1.c_str(), Status::Ok, "1 1 1 1 1 1 1 1 1 / 0 0 0 0 0 0 0 0 0"},
      {"Paint 2: a run, no code, bytes and white behind them", MspRead, paint2.c_str(), Status::Ok,
       "0 1 0 1 0 1 0 1 0 1 0 1 0 1 0 1 0 1 0 1 0 1 0 1 / 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 1 / "
       "0 0 0 0 0 0 0 1 0 0 0 0 0 0 1 0 1 1 1 1 1 1 1 1"},
      {"HRZ of another size", HrzRead, "00", Status::FileReadError, ""},
  };
  for (const ReadRow& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(row.read, Hex(row.file));
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
  }
}

TEST(OldBitmaps, ColorsOfSixBits) {
  Bytes file(256 * 240 * 3);
  file[0] = 63, file[1] = 32, file[2] = 1;
  const Decoded decoded = Decode(HrzRead, file);
  ASSERT_EQ(decoded.status, Status::Ok);
  EXPECT_EQ(decoded.picture->image.PixelAt(0, 0), 0xFF8204);
  EXPECT_EQ(Encode(HrzWrite, *decoded.picture), file);
  file.push_back(0);
  EXPECT_EQ(Decode(HrzRead, file).status, Status::DamagedFile);
}

// A file of three rows of two pixels, black only at the top left, oriented by a record.
Bytes Drawing(const std::string& records) {
  const PicturePointer picture = PatternPicture(2, 3, 1);
  for (int32_t i = 0; i < 6; ++i) SetPixel(picture->image, i % 2, i / 2, i > 0);
  Bytes file = Encode(CalsWrite, *picture);
  for (size_t i = 0; i < records.size(); ++i) file[7 * 128 + i] = static_cast<uint8_t>(records[i]);
  return file;
}

TEST(OldBitmaps, RotatesDrawingsUpright) {
  const std::pair<const char*, const char*> rows[] = {
      {"rorient: 000,270", "1 0 / 0 0 / 0 0"}, {"RORIENT:000,090 ", "0 0 / 0 0 / 1 0"}, {"rorient: 180,090", "0 1 / 0 0 / 0 0"},
      {"rorient: 180,270", "0 0 / 0 0 / 0 1"}, {"rorient: 270,270", "0 0 1 / 0 0 0"},   {"rorient: 090,270", "0 0 0 / 1 0 0"},
      {"rorient: 270,090", "1 0 0 / 0 0 0"},   {"rorient: 090,090", "0 0 0 / 0 0 1"},   {"rorient: oblique", "1 0 / 0 0 / 0 0"},
  };
  for (const auto& [record, pixels] : rows) {
    const Decoded decoded = Decode(CalsRead, Drawing(record));
    EXPECT_EQ(decoded.status, Status::Ok);
    EXPECT_EQ(PixelText(decoded.picture->image), pixels) << record;
    EXPECT_EQ(decoded.picture->width, decoded.picture->image.Width()) << record;
  }
  Bytes file = Drawing("");
  const std::string drawing(file.begin(), file.begin() + 2048);
  EXPECT_NE(drawing.find("rpelcnt: 000002,000003"), std::string::npos);
  file.resize(2048);
  EXPECT_EQ(Decode(CalsRead, file).status, Status::FileReadError);
  file.resize(2047);
  EXPECT_EQ(Decode(CalsRead, file).status, Status::FileReadError);
}

// White on black is stored as such, in whichever order the palette has the two colors.
TEST(OldBitmaps, StoresTheDarkerColorAsBlack) {
  const PicturePointer picture = PatternPicture(8, 1, 1);
  for (int32_t x = 0; x < 8; ++x) SetPixel(picture->image, x, 0, x == 0);
  EXPECT_EQ(Encode(WbmpWrite, *picture), Hex("00 00 08 01 80"));
  picture->palette[0] = picture->palette[1] = picture->palette[2] = 255;
  picture->palette[3] = picture->palette[4] = picture->palette[5] = 0;
  EXPECT_EQ(Encode(WbmpWrite, *picture), Hex("00 00 08 01 7F"));
}

}  // namespace
}  // namespace fotomill::test
