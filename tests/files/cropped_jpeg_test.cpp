#include "files/cropped_jpeg.h"

#include <gtest/gtest.h>

#include "formats/jpeg/jpeg.h"
#include "metadata/exif/picture_exif.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

TEST(CroppedJpeg, AreasTurnWithTheOrientation) {
  const Size stored{100, 60};
  const Rectangle area{10, 20, 30, 15};
  const struct {
    Orientation orientation;
    Rectangle stored;
  } kRows[] = {{Orientation::Upright, {10, 20, 30, 15}},
               {Orientation::MirrorAcross, {60, 20, 30, 15}},
               {Orientation::HalfTurn, {60, 25, 30, 15}},
               // shown 60 x 100: the left of what is shown is the bottom of what is stored
               {Orientation::QuarterRight, {20, 20, 15, 30}},
               {Orientation::QuarterLeft, {65, 10, 15, 30}}};
  for (const auto& row : kRows) {
    EXPECT_EQ(StoredArea(area, stored, row.orientation), row.stored);
    EXPECT_EQ(ShownArea(row.stored, stored, row.orientation), area);
  }
  const JpegGrid grid{stored, {16, 8}};
  EXPECT_EQ(LosslessArea(area, grid, Orientation::Upright), (Rectangle{16, 24, 24, 11}));
  EXPECT_EQ(LosslessArea({1, 3, 5, 4}, grid, Orientation::Upright), (Rectangle{0, 0, 6, 7}));
  // the right edge of what is shown is the left one of what is stored
  EXPECT_EQ(LosslessArea({10, 20, 30, 15}, grid, Orientation::MirrorAcross),
            (Rectangle{10, 24, 26, 11}));
}

// Every pixel of the new file is the one of the old file; where chroma is subsampled, neighbors
// across the cut edge are missing, so the outermost pixels are left out.
void ExpectPart(const std::vector<uint8_t>& whole, const std::vector<uint8_t>& part,
                const Rectangle& area) {
  const Decoded old = Decode(JpegRead, whole), made = Decode(JpegRead, part);
  ASSERT_EQ(made.status, Status::Ok);
  ASSERT_EQ(TurnUpright(*old.picture), Status::Ok);
  ASSERT_EQ(TurnUpright(*made.picture), Status::Ok);
  ASSERT_EQ(made.picture->image.Width(), area.width);
  ASSERT_EQ(made.picture->image.Height(), area.height);
  for (int32_t y = 2; y < area.height - 2; ++y) {
    for (int32_t x = 2; x < area.width - 2; ++x) {
      ASSERT_EQ(made.picture->image.PixelAt(x, y),
                old.picture->image.PixelAt(area.x + x, area.y + y))
          << x << " " << y;
    }
  }
}

TEST(CroppedJpeg, KeepsEveryPixel) {
  std::vector<std::vector<uint8_t>> rows;
  for (uint32_t y = 0; y < 45; ++y) rows.push_back(RandomBytes(61, y));
  const PicturePointer picture = PatternPicture(100, 60, 24), gray = MakePicture(61, 45, 8, rows);
  const std::vector<uint8_t> upright = Encode(JpegWrite, *picture);
  // orientation 6: a quarter turn to the right
  picture->metadata.exif = Hex("4D4D002A00000008 0001 0112 0003 00000001 00060000 00000000");
  const std::vector<uint8_t> turned = Encode(JpegWrite, *picture);
  const std::vector<uint8_t> grays = Encode(JpegWrite, *gray);
  const struct {
    const char* name;
    const std::vector<uint8_t>& file;
    Rectangle area;
    bool possible;
  } kRows[] = {{"between blocks", upright, {16, 32, 41, 19}, true},
               {"to the lower right corner", upright, {48, 16, 52, 44}, true},
               {"beyond the picture", upright, {16, 16, 500, 500}, true},
               {"within a block", upright, {15, 32, 40, 20}, false},
               {"gray has blocks of 8", grays, {8, 24, 20, 10}, true},
               {"turned by its tag", turned, {10, 16, 34, 48}, true},
               {"turned, within a block", turned, {11, 17, 34, 48}, false}};
  for (const auto& row : kRows) {
    SCOPED_TRACE(row.name);
    std::vector<uint8_t> made;
    RecordedText obstacle;
    ASSERT_EQ(MakeCroppedJpeg(row.file, row.area, {}, made, obstacle), Status::Ok);
    EXPECT_EQ(obstacle.empty(), row.possible) << obstacle.shown;
    EXPECT_EQ(made.empty(), !row.possible);
    if (!row.possible) continue;
    Rectangle kept = row.area;
    if (kept.width == 500) kept = {16, 16, 84, 44};
    ExpectPart(row.file, made, kept);
  }
  std::vector<uint8_t> made;
  RecordedText obstacle;
  EXPECT_EQ(MakeCroppedJpeg(Hex("FFD8FFD9"), {0, 0, 8, 8}, {}, made, obstacle),
            Status::DamagedFile);
}

}  // namespace
}  // namespace fotomill::test
