#include "processing/geometry/orient.h"

#include <algorithm>

#include "processing/pictures.h"
#include "processing/promote.h"

namespace fotomill {
namespace {

using test::Colors;
using test::MakePicture;

TEST(Orient, TheLetterFIsUpright) {
  // An F of 2 x 3 pixels, numbered 1 to 6 row by row, as each orientation stores it.
  struct Row {
    int32_t orientation;
    int32_t width;
    std::vector<uint32_t> stored;
  };
  const Row rows[] = {
      {1, 2, {1, 2, 3, 4, 5, 6}}, {2, 2, {2, 1, 4, 3, 6, 5}}, {3, 2, {6, 5, 4, 3, 2, 1}}, {4, 2, {5, 6, 3, 4, 1, 2}},
      {5, 3, {1, 3, 5, 2, 4, 6}}, {6, 3, {2, 4, 6, 1, 3, 5}}, {7, 3, {6, 4, 2, 5, 3, 1}}, {8, 3, {5, 3, 1, 6, 4, 2}},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.orientation);
    const PicturePointer picture = MakePicture(row.width, 6 / row.width, [&](int32_t x, int32_t y) {
      return row.stored[static_cast<size_t>(y * row.width + x)];
    });
    picture->metadata.dpiX = row.width;
    picture->metadata.dpiY = 6 / row.width;
    ASSERT_EQ(OrientPicture(*picture, static_cast<Orientation>(row.orientation)), Status::Ok);
    EXPECT_EQ(Colors(*picture), (std::vector<uint32_t>{1, 2, 3, 4, 5, 6}));
    EXPECT_EQ(picture->width, 2);
    EXPECT_EQ(picture->height, 3);
    EXPECT_EQ(picture->metadata.dpiX, 2);
  }
}

TEST(Orient, ComposesTwoRotations) {
  for (int32_t pair = 0; pair < 64; ++pair) {
    const auto first = static_cast<Orientation>(1 + pair / 8),
               then = static_cast<Orientation>(1 + pair % 8);
    const auto number = [](int32_t x, int32_t y) { return static_cast<uint32_t>(3 * y + x); };
    const PicturePointer twice = MakePicture(3, 2, number), once = MakePicture(3, 2, number);
    ASSERT_EQ(OrientPicture(*twice, first), Status::Ok);
    ASSERT_EQ(OrientPicture(*twice, then), Status::Ok);
    ASSERT_EQ(OrientPicture(*once, Composed(first, then)), Status::Ok);
    EXPECT_EQ(Colors(*once), Colors(*twice)) << pair;
    EXPECT_EQ(once->width, twice->width) << pair;
  }
}

TEST(Orient, UndoneByItsInverseAtEveryDepth) {
  constexpr int32_t kInverse[] = {0, 1, 2, 3, 4, 5, 8, 7, 6};
  for (const int32_t bits : {1, 4, 8, 24}) {
    for (const auto& [width, height] :
         {std::pair{1, 1}, {1, 70}, {70, 1}, {33, 65}, {100, 31}, {150, 260}}) {
      for (int32_t orientation = 1; orientation <= 8; ++orientation) {
        SCOPED_TRACE(testing::Message() << bits << " bits, " << width << " x " << height << ", " << orientation);
        const uint32_t colors = bits == 24 ? 0x1000000 : 1u << bits;
        const PicturePointer picture = MakePicture(width, height, [&](int32_t x, int32_t y) {
          return test::Scatter(x, y) % colors * (bits == 24 ? 1 : 0x010305) & 0xffffff;
        });
        const PicturePointer deep = MakePicture(
            width, height, [&](int32_t x, int32_t y) { return test::ColorAt(*picture, x, y); });
        bool packed = false;
        ASSERT_EQ(PackFewColors(*picture, bits, packed), Status::Ok);
        test::AddAlpha(*picture, [](int32_t x, int32_t y) { return (x * 3 + y * 7) & 255; });
        const std::vector<uint32_t> before = Colors(*picture);
        const std::vector<uint8_t> table(picture->image.ColorTable().begin(),
                                         picture->image.ColorTable().end());
        ASSERT_EQ(OrientPicture(*picture, static_cast<Orientation>(orientation)), Status::Ok);
        ASSERT_EQ(OrientPicture(*deep, static_cast<Orientation>(orientation)), Status::Ok);
        EXPECT_EQ(Colors(*picture), Colors(*deep));
        EXPECT_TRUE(std::ranges::equal(picture->image.ColorTable(), table));
        EXPECT_EQ(picture->alpha.Width(), picture->image.Width());
        EXPECT_EQ(picture->width, picture->image.Width());
        ASSERT_EQ(OrientPicture(*picture, static_cast<Orientation>(kInverse[orientation])), Status::Ok);
        EXPECT_EQ(Colors(*picture), before);
        for (int32_t y = 0; y < height; ++y) {
          for (int32_t x = 0; x < width; ++x)
            ASSERT_EQ(picture->alpha.PixelAt(x, y), (x * 3 + y * 7) & 255);
        }
      }
    }
  }
}

}  // namespace
}  // namespace fotomill
