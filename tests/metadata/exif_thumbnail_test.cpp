#include "metadata/exif_thumbnail.h"

#include <gtest/gtest.h>

#include "metadata/exif_source.h"
#include "metadata/exif_walk.h"
#include "picture/registry.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_environment.h"

namespace fotomill::test {
namespace {

TEST(ExifThumbnail, FailsCleanlyAndLeavesNoFile) {
  const TemporaryFolder folder;
  const ScopedEnvironment temporary("TMPDIR", folder.Path());
  PicturePointer picture = NewPictureRecord();
  EXPECT_EQ(DecodeExifThumbnail({}, picture), Status::EmptyImage);
  EXPECT_EQ(picture, nullptr);
  EXPECT_NE(DecodeExifThumbnail(Hex("FFD8 FFD9"), picture), Status::Ok);
  EXPECT_EQ(picture, nullptr);
  EXPECT_TRUE(folder.Names().empty());
}

TEST(ExifThumbnail, DecodesThoseOfCameras) {
  const int32_t row = FindFormatByName("small.JPG");
  if (CorpusFolder().empty() || row == kNoFormat || !CanRead(FormatRow(row))) GTEST_SKIP() << "needs pictures and a JPEG codec";
  const TemporaryFolder folder;
  const ScopedEnvironment temporary("TMPDIR", folder.Path());
  ExifSource source;
  ASSERT_EQ(source.Open((CorpusFolder() + "/jpeg-exif/DSCN0010.jpg").c_str()), Status::Ok);
  ExifFindings findings;
  ASSERT_TRUE(WalkExif(source.Block(), nullptr, &findings));
  PicturePointer picture;
  ASSERT_EQ(DecodeExifThumbnail(ExifThumbnail(source.Block(), findings), picture), Status::Ok);
  EXPECT_EQ(picture->width, 160);
  EXPECT_EQ(picture->height, 120);
  EXPECT_FALSE(picture->image.Empty());
  EXPECT_TRUE(folder.Names().empty());
}

}  // namespace
}  // namespace fotomill::test
