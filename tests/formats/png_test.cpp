#include "formats/png.h"

#include <gtest/gtest.h>

#include "core/settings.h"
#include "support/codecs.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

TEST(Png, MetadataTravels) {
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

TEST(Png, BrokenFilesFailWithTheirStatus) {
  const std::vector<uint8_t> file = Encode(PngWrite, *PatternPicture(40, 40, 8));
  std::vector<uint8_t> flipped = file;
  flipped[file.size() / 2] ^= 0x55;
  EXPECT_EQ(Decode(PngRead, flipped).status, Status::DamagedFile);
  EXPECT_EQ(Decode(PngRead, std::span(file).first(file.size() / 2)).status, Status::FileReadError);
  std::vector<uint8_t> huge = file;  // sizes that no memory holds, and a CRC that no longer fits: refused either way
  for (size_t i = 16; i < 24; ++i) huge[i] = 0x7f;
  EXPECT_NE(Decode(PngRead, huge).status, Status::Ok);
}

}  // namespace
}  // namespace fotomill::test
