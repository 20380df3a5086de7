#include "metadata/exif/picture_exif.h"

#include <gtest/gtest.h>

#include "metadata/exif/exif_edit.h"
#include "support/codecs.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

TEST(PictureExif, UprightPicturesHaveMatchingExif) {
  const PicturePointer picture = PatternPicture(3, 2, 8);
  const int32_t topLeft = picture->image.PixelAt(0, 0);
  picture->metadata.exif = Hex(R"(49492A00 08000000 0300
      0001 0400 01000000 03000000   # width 3
      0101 0400 01000000 02000000   # height 2
      1201 0300 01000000 06000000   # orientation 6: a quarter turn clockwise makes it upright
      00000000)");
  ASSERT_EQ(TurnUpright(*picture), Status::Ok);
  RefreshExif(*picture);
  EXPECT_EQ(picture->image.Width(), 2);
  EXPECT_EQ(picture->image.PixelAt(1, 0), topLeft);
  EXPECT_EQ(picture->metadata.exif, Hex(R"(49492A00 08000000 0300
      0001 0400 01000000 02000000
      0101 0400 01000000 03000000
      1201 0300 01000000 01000000
      00000000)"));
  ASSERT_EQ(TurnUpright(*picture), Status::Ok);
  EXPECT_EQ(picture->image.Width(), 2);
}

}  // namespace
}  // namespace fotomill::test
