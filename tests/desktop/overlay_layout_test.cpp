#include <gtest/gtest.h>

#include "desktop/models/view/overlay_layout.h"

namespace fotomill::desktop {
namespace {

using Part = OverlayLayout::Part;

OverlayLayout::Input InputOf(size_t files, size_t current) {
  OverlayLayout::Input input;
  input.width = 640;
  input.height = 600;
  input.buttons = 11;
  input.files = files;
  input.current = current;
  return input;
}

TEST(OverlayLayout, KeepsTheCurrentFileInTheMiddle) {
  // (640 - 2 * 12 - 2 * 4 + 4) / 68 = 9 cells fit.
  struct Case {
    size_t files, current, first, end;
  };
  constexpr Case kCases[] = {{100, 50, 46, 55},  {100, 0, 0, 9}, {100, 99, 91, 100}, {100, 3, 0, 9},
                             {100, 97, 91, 100}, {4, 2, 0, 4},   {1, 0, 0, 0}};
  for (const Case& row : kCases) {
    const OverlayLayout layout(InputOf(row.files, row.current));
    EXPECT_EQ(layout.Cells().first, row.first) << row.files << " " << row.current;
    EXPECT_EQ(layout.Cells().end, row.end) << row.files << " " << row.current;
  }
  const OverlayLayout layout(InputOf(100, 50));
  const Rect cell = layout.Cell(50);
  EXPECT_EQ(2 * cell.x + cell.width, 640);
}

TEST(OverlayLayout, FindsWhatIsAtAPoint) {
  const OverlayLayout layout(InputOf(100, 50));
  const Rect bar = layout.Bar();
  EXPECT_GE(bar.x, 0);
  EXPECT_EQ(bar.y + bar.height, 600 - 12);
  for (const size_t button : {size_t{0}, size_t{10}}) {
    const Rect rect = layout.Button(button);
    EXPECT_EQ(layout.At(rect.x, rect.y), (OverlayLayout::Hit{Part::Button, button}));
    EXPECT_EQ(layout.At(rect.x + rect.width, rect.y).part, Part::Bar);
  }
  for (const size_t file : {size_t{46}, size_t{54}}) {
    const Rect rect = layout.Cell(file);
    EXPECT_EQ(layout.At(rect.x + rect.width - 1, rect.y), (OverlayLayout::Hit{Part::Cell, file}));
    EXPECT_GE(layout.Button(0).y, rect.y + rect.height);
  }
  const Rect caption = layout.Caption();
  EXPECT_EQ(layout.At(caption.x, caption.y).part, Part::Bar);
  EXPECT_EQ(layout.At(bar.x, bar.y - 1).part, Part::Outside);
}

TEST(OverlayLayout, LeavesRoomForThePicture) {
  OverlayLayout::Input low = InputOf(100, 50);
  low.height = 250;  // buttons, but no film strip
  EXPECT_EQ(OverlayLayout(low).Cells().end, OverlayLayout(low).Cells().first);
  EXPECT_GT(OverlayLayout(low).Bar().height, 0);
  low.height = 100;
  EXPECT_EQ(OverlayLayout(low).Bar().height, 0);
  OverlayLayout::Input narrow = InputOf(100, 50);
  narrow.width = 300;
  EXPECT_EQ(OverlayLayout(narrow).At(150, 580).part, Part::Outside);
  EXPECT_EQ(OverlayLayout().At(0, 0).part, Part::Outside);
  OverlayLayout::Input plain = InputOf(100, 50);
  plain.strip = false;
  EXPECT_EQ(OverlayLayout(plain).Cells().end, OverlayLayout(plain).Cells().first);
}

TEST(Fade, GoesOnFromWhereItTurns) {
  Fade fade;
  EXPECT_EQ(fade.Opacity(0), 0);
  fade.Turn(true, 10);
  EXPECT_NEAR(fade.Opacity(10 + Fade::kSeconds / 4), 0.25, 1e-9);
  fade.Turn(false, 10 + Fade::kSeconds / 2);
  EXPECT_NEAR(fade.Opacity(10 + Fade::kSeconds * 3 / 4), 0.25, 1e-9);
  EXPECT_TRUE(fade.Changing(10 + Fade::kSeconds * 3 / 4));
  EXPECT_EQ(fade.Opacity(20), 0);
  EXPECT_FALSE(fade.Changing(20));
  fade.Turn(true, 30, false);
  EXPECT_EQ(fade.Opacity(30), 1);
}

}  // namespace
}  // namespace fotomill::desktop
