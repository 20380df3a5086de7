#include "catalog/thumbnails/exif_thumbnail.h"

#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_environment.h"

namespace fotomill::test {
namespace {

TEST(ExifThumbnail, DecodesAndLeavesNoFile) {
  const TemporaryFolder folder;
  const ScopedEnvironment temporary("TMPDIR", folder.Path());
  PicturePointer picture = PatternPicture(4, 3, 24);
  ASSERT_EQ(WritePicture(*picture, folder.Path("small.jpg"), {}), Status::Ok);
  EXPECT_EQ(DecodeExifThumbnail({}, picture), Status::EmptyImage);
  EXPECT_EQ(picture, nullptr);
  EXPECT_NE(DecodeExifThumbnail(Hex("FFD8 FFD9"), picture), Status::Ok);
  EXPECT_EQ(picture, nullptr);
  ASSERT_EQ(DecodeExifThumbnail(ReadBytes(folder.Path("small.jpg")), picture), Status::Ok);
  EXPECT_EQ(picture->image.Width(), 4);
  EXPECT_EQ(folder.Names(), std::vector<std::string>{"small.jpg"});
}

}  // namespace
}  // namespace fotomill::test
