#include "formats/webp/webp.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>

#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

PicturePointer TransparentPicture() {
  PicturePointer picture = PatternPicture(33, 7, 24);
  EXPECT_EQ(NewAlphaPlane(33, 7, picture->alpha), Status::Ok);
  for (int32_t y = 0; y < 7; ++y) {
    for (int32_t x = 0; x < 33; ++x)
      picture->alpha.Row(y)[static_cast<size_t>(x)] = static_cast<uint8_t>(x * 8 + y);
  }
  return picture;
}

TEST(Webp, LosslessIsExact) {
  const ScopedSettings scoped;
  settings.WebPLossless = 1;
  const PicturePointer plain = PatternPicture(50, 40, 24), transparent = TransparentPicture();
  for (const bool metadata : {false, true}) {  // metadata changes the file's layout
    if (metadata) plain->metadata.xmp = transparent->metadata.xmp = {'<', 'x', '>'};
    const Decoded first = Decode(WebpRead, Encode(WebpWrite, *plain));
    ASSERT_EQ(first.status, Status::Ok);
    EXPECT_TRUE(SamePixels(first.picture->image, plain->image));
    EXPECT_TRUE(first.picture->alpha.Empty());
    const Decoded second = Decode(WebpRead, Encode(WebpWrite, *transparent));
    ASSERT_EQ(second.status, Status::Ok);
    EXPECT_TRUE(SamePixels(second.picture->image, transparent->image));
    EXPECT_TRUE(SamePixels(second.picture->alpha, transparent->alpha));
  }
}

TEST(Webp, MetadataRoundTrips) {
  const ScopedSettings scoped;
  for (const bool alpha : {false, true}) {
    const PicturePointer picture = alpha ? TransparentPicture() : PatternPicture(5, 3, 24);
    picture->metadata.exif = {'I', 'I', 42, 0, 8, 0, 0, 0, 0, 0, 0, 0, 0, 0};
    picture->metadata.xmp = {'<', 'x', '>'};  // odd size
    picture->metadata.icc.assign(131, 9);
    settings.PreserveEXIF = 1;
    const Decoded back = Decode(WebpRead, Encode(WebpWrite, *picture));
    ASSERT_EQ(back.status, Status::Ok);
    EXPECT_EQ(back.picture->metadata.exif, picture->metadata.exif);
    EXPECT_EQ(back.picture->metadata.xmp, picture->metadata.xmp);
    EXPECT_EQ(back.picture->metadata.icc, picture->metadata.icc);
    EXPECT_EQ(back.picture->alpha.Empty(), !alpha);
    settings.PreserveEXIF = 0;
    const Decoded bare = Decode(WebpRead, Encode(WebpWrite, *picture));
    EXPECT_TRUE(bare.picture->metadata.exif.empty() && bare.picture->metadata.xmp.empty());
    EXPECT_EQ(bare.picture->metadata.icc, picture->metadata.icc);  // belongs to the colors
  }
}

TEST(Webp, ComposesFrames) {
  const std::vector<uint8_t> replacing =
      ReadBytes(SourcePath("tests/formats/webp/good/frames.webp"));
  std::vector<uint8_t> blending = replacing;
  constexpr std::string_view kFrame = "ANMF";
  for (auto at = blending.begin(); at != blending.end();) {
    at = std::search(at, blending.end(), kFrame.begin(), kFrame.end());
    if (at != blending.end()) *(at += 23) = 0;  // its flags
  }
  struct Row {
    const std::vector<uint8_t>& file;
    int32_t page;
    Status status;
    const char *left, *middle, *right;  // at 3, 12 and 20 from the left: alpha and color
  };
  const Row rows[] = {
      {replacing, 0, Status::Ok, "255 ff0000", "255 ff0000", "0 000000"},
      {replacing, 1, Status::Ok, "0 000000", "195 ff5000", "0 000000"},
      {blending, 1, Status::Ok, "255 ff0000", "255 ff3d00", "0 000000"},
      {replacing, 2, Status::Ok, "0 000000", "135 ffa000", "135 ffa000"},
      {replacing, 3, Status::NoImages, "", "", ""},
  };
  const TemporaryFolder folder;
  for (const Row& row : rows) {
    SCOPED_TRACE(row.page);
    WriteBytes(folder.Path("a.webp"), row.file);
    const PicturePointer picture = NewPictureRecord();
    ASSERT_EQ(WebpRead(*picture, {.fileName = folder.Path("a.webp"), .page = row.page}), row.status);
    EXPECT_EQ(picture->pageCount, 3);
    if (row.status != Status::Ok) continue;
    const auto at = [&](int32_t x) {
      char text[24];
      const int32_t alpha = picture->alpha.PixelAt(x, 5);
      std::snprintf(text, sizeof text, "%d %06x", alpha,
                    alpha == 0 ? 0 : picture->image.PixelAt(x, 5));
      return std::string(text);
    };
    EXPECT_EQ(at(3), row.left);
    EXPECT_EQ(at(12), row.middle);
    EXPECT_EQ(at(20), row.right);
  }
}

TEST(Webp, InvalidFilesFail) {
  const std::vector<uint8_t> file = Encode(WebpWrite, *PatternPicture(40, 40, 24));
  for (size_t length = 0; length < file.size() - 1; ++length) {  // the last byte may be padding
    const Decoded decoded = Decode(WebpRead, std::span(file).first(length));
    EXPECT_EQ(decoded.picture->image.Empty(), decoded.status != Status::Ok) << length;
    if (length < file.size() / 2) {
      EXPECT_EQ(decoded.status, Status::FileReadError) << length;
    }
  }
  std::vector<uint8_t> foreign = file;
  foreign[8] = 'X';
  EXPECT_EQ(Decode(WebpRead, foreign).status, Status::DamagedFile);
}

}  // namespace
}  // namespace fotomill::test
