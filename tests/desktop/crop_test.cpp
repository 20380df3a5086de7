#include "desktop/models/edit/crop_area.h"

#include <gtest/gtest.h>

namespace fotomill::desktop {
namespace {

using enum CropGrip;

TEST(CropArea, StaysInThePictureAndKeepsItsRatio) {
  const Rectangle start{20, 20, 30, 20};
  const struct {
    const char* name;
    const char* ratio;
    CropGrip grip;
    double right, down;
    Rectangle area;
  } kRows[] = {
      {"inside", "", Inside, 5, -7, {25, 13, 30, 20}},
      {"inside, to the corner", "", Inside, 500, 500, {70, 60, 30, 20}},
      {"left", "", Left, -5, 99, {15, 20, 35, 20}},
      {"left, past the right edge", "", Left, 500, 0, {49, 20, 1, 20}},
      {"bottom right, past the picture", "", BottomRight, 500, 500, {20, 20, 80, 60}},
      {"top left, past the picture", "", TopLeft, -500, -500, {0, 0, 50, 40}},
      {"ratio, right", "3:2", Right, 6, 0, {20, 18, 36, 24}},
      {"ratio, right, until the top", "3:2", Right, 80, 0, {20, 3, 80, 53}},
      {"ratio, top", "3:2", Top, 0, 10, {28, 30, 15, 10}},
      {"ratio, bottom right", "3:2", BottomRight, 30, 1, {20, 20, 60, 40}},
      {"ratio, bottom right, downward", "3:2", BottomRight, 1, 20, {20, 20, 60, 40}},
      {"ratio, top left, past the picture", "3:2", TopLeft, -50, 0, {0, 7, 50, 33}},
  };
  for (const auto& row : kRows) {
    SCOPED_TRACE(row.name);
    CropArea area;
    CropRatio ratio;
    EXPECT_EQ(ReadCropRatio(row.ratio, ratio), *row.ratio != '\0');
    area.SetPicture({100, 80});
    area.SetRatio(ratio);
    area.Drag(row.grip, start, row.right, row.down);
    EXPECT_EQ(area.Area(), row.area) << area.Area().x << " " << area.Area().y << " "
                                     << area.Area().width << " " << area.Area().height;
  }
}

TEST(CropArea, SuggestsMovesAndSpans) {
  CropArea area;
  area.SetPicture({100, 80});
  EXPECT_EQ(area.Area(), (Rectangle{0, 0, 100, 80}));
  area.SetRatio({1, 1});
  EXPECT_EQ(area.Area(), (Rectangle{10, 0, 80, 80}));
  area.SetPicture({50, 200});
  EXPECT_EQ(area.Area(), (Rectangle{0, 75, 50, 50}));
  area.SetArea({-20, 190, 30, 7});  // the ratio decides the height
  EXPECT_EQ(area.Area(), (Rectangle{0, 170, 30, 30}));
  area.MoveBy(1, -1);
  EXPECT_EQ(area.Area(), (Rectangle{1, 169, 30, 30}));
  area.SetRatio({});
  area.Span(40, 50, 20, 90);
  EXPECT_EQ(area.Area(), (Rectangle{20, 50, 21, 41}));
  area.SetArea({0, 0, 1000, 1000});
  EXPECT_EQ(area.Area(), (Rectangle{0, 0, 50, 200}));
}

TEST(CropArea, ReadsRatios) {
  CropRatio ratio;
  for (const char* wrong : {"", "any", "0:1", "3:", "3:2:1", "-1", "1e9"})
    EXPECT_FALSE(ReadCropRatio(wrong, ratio)) << wrong;
  EXPECT_TRUE(ReadCropRatio("1.5", ratio));
  EXPECT_EQ(ratio, (CropRatio{1.5, 1}));
}

TEST(CropArea, FindsGrips) {
  const Rectangle shown{100, 50, 200, 100};
  const struct {
    int32_t x, y;
    CropGrip grip;
  } kRows[] = {{96, 54, TopLeft}, {300, 148, BottomRight}, {200, 52, Top},     {101, 100, Left},
               {298, 100, Right}, {200, 155, Bottom},      {200, 100, Inside}, {80, 100, None}};
  for (const auto& row : kRows) EXPECT_EQ(GripAt(shown, row.x, row.y, 6), row.grip) << row.x;
}

TEST(CropArea, StraightensAlongTheNearestAxis) {
  EXPECT_DOUBLE_EQ(StraighteningAngle(0, 0, 10, 0), 0);
  EXPECT_NEAR(StraighteningAngle(0, 0, 100, 5), -2.862, 0.001);   // falls to the right
  EXPECT_NEAR(StraighteningAngle(100, 5, 0, 0), -2.862, 0.001);   // drawn from the right
  EXPECT_NEAR(StraighteningAngle(0, 0, 5, -100), -2.862, 0.001);  // an upright edge
  EXPECT_NEAR(StraighteningAngle(0, 100, 100, 98), 1.146, 0.001);
}

TEST(CropArea, PrintsRecipes) {
  EXPECT_EQ(CropRecipe(0, {0, 0, 100, 80}, {100, 80}), "");
  EXPECT_EQ(CropRecipe(0, {1, 2, 30, 40}, {100, 80}), "crop 30x40+1+2\n");
  EXPECT_EQ(CropRecipe(-1.5, {0, 0, 100, 80}, {100, 80}), "straighten -1.50\n");
  EXPECT_EQ(SamePart({25, 20, 50, 40}, {100, 80}, {200, 40}), (Rectangle{50, 10, 100, 20}));
}

}  // namespace
}  // namespace fotomill::desktop
