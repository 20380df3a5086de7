#include "formats/png/png.h"

#include <gtest/gtest.h>

#include "processing/promote.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/peers.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

TEST(Png, MetadataRoundTrips) {
  const ScopedSettings scoped;
  const PicturePointer picture = PatternPicture(5, 3, 24);
  picture->metadata.exif = {'I', 'I', 42, 0, 8, 0, 0, 0, 0, 0, 0, 0, 0, 0};
  picture->metadata.xmp = {'<', 'x', '/', '>'};
  picture->metadata.dpiX = picture->metadata.dpiY = 300;
  picture->comment = {'h', 'i'};
  const Decoded back = Decode(PngRead, Encode(PngWrite, *picture));
  ASSERT_EQ(back.status, Status::Ok);
  EXPECT_EQ(back.picture->metadata.exif, picture->metadata.exif);
  EXPECT_EQ(back.picture->metadata.xmp, picture->metadata.xmp);
  EXPECT_NEAR(back.picture->metadata.dpiX, 300, 0.05);
  EXPECT_EQ(back.picture->comment, picture->comment);

  settings.PreserveEXIF = 0;
  const Decoded without = Decode(PngRead, Encode(PngWrite, *picture));
  EXPECT_TRUE(without.picture->metadata.Empty());
}

// Bands are deflated separately: their streams must be joined without a gap, and the checksum must
// cover all of them.
TEST(Png, BandsBecomeOneStream) {
  const ScopedSettings scoped;
  const TemporaryFolder folder;
  struct Row {
    int32_t level, width, height;
  };
  // nine bands, and two bands twice
  for (const Row& row : {Row{0, 3500, 3600}, Row{1, 1600, 900}, Row{9, 1600, 900}}) {
    SCOPED_TRACE(row.level);
    settings.PngCompression = row.level;
    const PicturePointer picture = PatternPicture(row.width, row.height, 24);
    for (int32_t y = 100; y < 800; ++y) {  // smooth areas produce other block types
      for (size_t i = 0; i < 3000; ++i) picture->image.Row(y)[i] = static_cast<uint8_t>(y + i / 30);
    }
    const std::vector<uint8_t> file = Encode(PngWrite, *picture);
    const Decoded back = Decode(PngRead, file);
    ASSERT_EQ(back.status, Status::Ok);
    EXPECT_TRUE(SamePixels(picture->image, back.picture->image));
    WriteBytes(folder.Path("a.png"), file);
    if (HasProgram("pngtopnm")) {
      EXPECT_TRUE(RunShell("pngtopnm " + folder.Path("a.png") + " > " + folder.Path("a.ppm") + " 2> " + folder.Path("log")));
      EXPECT_EQ(ReadText(folder.Path("log")), "");
    }
  }
}

// The first row of a band is filtered against the last one of the previous band.
TEST(Png, RowsAreFilteredAcrossTheEndsOfBands) {
  const PicturePointer picture = PatternPicture(1600, 900, 24);  // two bands
  // Every pixel is half of its left neighbor, so that Average would be best below a row of zeros.
  for (int32_t y = 0; y < 900; ++y) {
    for (size_t i = 0; i < 4800; ++i)
      picture->image.Row(y)[i] = static_cast<uint8_t>((128 >> i / 3 % 8) + y % 4);
  }
  const std::vector<uint8_t> file = Encode(PngWrite, *picture);
  const Decoded back = Decode(PngRead, file);
  ASSERT_EQ(back.status, Status::Ok);
  EXPECT_TRUE(SamePixels(picture->image, back.picture->image));
  if (!HasProgram("pngtopnm")) return;
  const TemporaryFolder folder;
  WriteBytes(folder.Path("a.png"), file);
  ASSERT_TRUE(RunShell("pngtopnm " + folder.Path("a.png") + " > " + folder.Path("a.ppm")));
  const std::vector<uint8_t> seen = ReadBytes(folder.Path("a.ppm"));
  ASSERT_GT(seen.size(), 900u * 4800);
  for (size_t y = 0; y < 900; ++y) {  // red first in the file
    ASSERT_EQ(seen[seen.size() - (900 - y) * 4800], picture->image.Row(static_cast<int32_t>(y))[2]) << y;
  }
}

TEST(Png, AlphaOfPalettePicturesIsKept) {
  const PicturePointer picture = PatternPicture(33, 7, 4);
  ASSERT_EQ(NewAlphaPlane(33, 7, picture->alpha), Status::Ok);
  for (int32_t x = 0; x < 33; ++x)
    picture->alpha.Row(3)[static_cast<size_t>(x)] = static_cast<uint8_t>(7 * x);
  const Decoded back = Decode(PngRead, Encode(PngWrite, *picture));
  ASSERT_EQ(back.status, Status::Ok);
  EXPECT_TRUE(SamePixels(back.picture->alpha, picture->alpha));
  ASSERT_EQ(PromotePicture(*picture), Status::Ok);
  EXPECT_TRUE(SamePixels(back.picture->image, picture->image));
}

TEST(Png, InvalidFilesFail) {
  const std::vector<uint8_t> file = Encode(PngWrite, *PatternPicture(40, 40, 8));
  std::vector<uint8_t> flipped = file;
  flipped[file.size() / 2] ^= 0x55;
  EXPECT_EQ(Decode(PngRead, flipped).status, Status::DamagedFile);
  EXPECT_EQ(Decode(PngRead, std::span(file).first(file.size() / 2)).status, Status::FileReadError);
  // impossible sizes, and a wrong CRC: rejected either way
  std::vector<uint8_t> huge = file;
  for (size_t i = 16; i < 24; ++i) huge[i] = 0x7f;
  EXPECT_NE(Decode(PngRead, huge).status, Status::Ok);
  std::vector<uint8_t> claims = file;  // a text of 640 MB in a small file
  constexpr uint8_t kText[] = {0x28, 0, 0, 0, 'z', 'T', 'X', 't'};
  claims.insert(claims.begin() + 33, std::begin(kText), std::end(kText));  // after IHDR
  EXPECT_EQ(Decode(PngRead, claims).status, Status::FileReadError);
}

}  // namespace
}  // namespace fotomill::test
