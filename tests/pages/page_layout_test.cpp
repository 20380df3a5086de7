#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>

#include "pages/catalog_look.h"
#include "pages/generators/contact.h"
#include "pages/generators/photo.h"
#include "pages/generators/print.h"
#include "pages/model/paper.h"
#include "pages/model/placing.h"

namespace fotomill::test {
namespace {

constexpr double kClose = 1e-6;

void ExpectBox(const Box& box, const Box& expected) {
  EXPECT_NEAR(box.x, expected.x, kClose);
  EXPECT_NEAR(box.y, expected.y, kClose);
  EXPECT_NEAR(box.width, expected.width, kClose);
  EXPECT_NEAR(box.height, expected.height, kClose);
}

Box PlaceOf(const PictureItem& item) { return BoundsOf(CornersOf(item)); }

const PictureItem& FirstPicture(const Page& page) {
  for (const PageItem& item : page.items) {
    if (const auto* const picture = std::get_if<PictureItem>(&item)) return *picture;
  }
  static const PictureItem none;
  ADD_FAILURE() << "no picture";
  return none;
}

TEST(Paper, Sizes) {
  const struct {
    const char* text;
    double width, height;  // 0: refused
  } rows[] = {
      {"A4", 210, 297},
      {"a4", 210, 297},
      {"letter", 215.9, 279.4},
      {"10x15cm", 100, 150},
      {"4x6in", 101.6, 152.4},
      {"4X6IN", 101.6, 152.4},
      {"210x297", 210, 297},
      {"2.5x3.5in", 63.5, 88.9},
      {"72x144pt", 25.4, 50.8},
      {"5081x10", 0, 0},
      {"0x10", 0, 0},
      {"-5x10", 0, 0},
      {"10x", 0, 0},
      {"x10", 0, 0},
      {"10", 0, 0},
      {"10x15xcm", 0, 0},
      {"nanxnan", 0, 0},
      {"1e3x10", 0, 0},
      {"A44", 0, 0},
      {"", 0, 0},
      {"10cmx15", 100, 15},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.text);
    const auto size = ParseSize(row.text, Papers());
    ASSERT_EQ(size.has_value(), row.width > 0);
    if (!size) continue;
    EXPECT_NEAR(size->width, row.width, kClose);
    EXPECT_NEAR(size->height, row.height, kClose);
  }
  EXPECT_EQ(ParseSize("passport", PrintSizes()), (PaperSize{35, 45}));
}

TEST(Placing, FitCoverTurn) {
  const PagePicture wide{.width = 300, .height = 200};
  const Box tall{10, 20, 100, 150};
  // inside, upright: the width decides
  ExpectBox(PlaceOf(PlacePicture(wide, tall, PictureFit::Inside, false)),
            {10, 20 + (150 - 200.0 / 3) / 2, 100, 200.0 / 3});
  // turned it fits exactly; its top edge runs down the right side
  const PictureItem turned = PlacePicture(wide, tall, PictureFit::Inside, true);
  ExpectBox(PlaceOf(turned), tall);
  EXPECT_EQ(turned.corner, (Point{110, 20}));
  EXPECT_EQ(turned.across, (Point{0, 150}));
  EXPECT_EQ(turned.down, (Point{-100, 0}));
  const PictureItem cover = PlacePicture(wide, tall, PictureFit::Cover, false);
  ExpectBox(PlaceOf(cover), {10 + (100 - 225) / 2.0, 20, 225, 150});
  ExpectBox(BoundsOf(cover.clip), tall);
}

TEST(ContactGrid, CellsStayWithinMargins) {
  for (const int32_t columns : {1, 4, 13}) {
    for (const int32_t rows : {1, 5, 40}) {
      ContactLayout layout{.pageWidth = 210, .pageHeight = 297, .columns = columns, .rows = rows};
      FitContactGrid(12, layout);
      const Box first = ContactArea(layout, 0), last = ContactArea(layout, columns * rows - 1);
      EXPECT_NEAR(first.x, 12, kClose);
      EXPECT_NEAR(first.y, 12, kClose);
      EXPECT_NEAR(last.Right(), 198, kClose);
      EXPECT_NEAR(last.Bottom() + layout.captionGap + layout.captionHeight, 285, kClose);
      EXPECT_GT(layout.cellHeight, layout.lineHeight);
    }
  }
  // the catalog's layout has whole pixels
  const ContactLayout layout = LayoutOf(
      {.columns = 2, .rows = 3, .cellHeight = 80, .pageWidth = 301, .pageHeight = 400}, "Arial");
  constexpr double kPixel = 25.4 / 96;
  // (301 - 2 x 108 + 12) / 2 and (400 - 3 x 101) / 2, 2 pixels to the picture
  ExpectBox(ContactArea(layout, 0), {50 * kPixel, 50 * kPixel, 96 * kPixel, 80 * kPixel});
  ExpectBox(ContactArea(layout, 3), {158 * kPixel, 151 * kPixel, 96 * kPixel, 80 * kPixel});
}

// What must hold for every packing.
void CheckPacking(std::span<const PaperSize> sizes, const PaperSize& room, double gap,
                  std::span<const PackedPlace> places) {
  ASSERT_EQ(places.size(), sizes.size());
  for (size_t i = 0; i < places.size(); ++i) {
    const Box& box = places[i].box;
    const PaperSize size = places[i].turned ? sizes[i].Turned() : sizes[i];
    EXPECT_NEAR(box.width, size.width, kClose) << i;
    EXPECT_NEAR(box.height, size.height, kClose) << i;
    EXPECT_GE(box.x, -kClose);
    EXPECT_GE(box.y, -kClose);
    EXPECT_LE(box.Right(), room.width + kClose) << i;
    EXPECT_LE(box.Bottom(), room.height + kClose) << i;
    for (size_t k = 0; k < i; ++k) {
      const Box& other = places[k].box;
      const bool apart =
          places[k].sheet != places[i].sheet || box.x >= other.Right() + gap - kClose ||
          other.x >= box.Right() + gap - kClose || box.y >= other.Bottom() + gap - kClose ||
          other.y >= box.Bottom() + gap - kClose;
      EXPECT_TRUE(apart) << i << " and " << k;
    }
  }
}

TEST(PackSheets, FewestSheets) {
  const PaperSize a4{200, 287};  // with margins of 5
  const struct {
    const char* name;
    std::vector<PaperSize> sizes;
    PaperSize room;
    double gap;
    size_t sheets;
  } rows[] = {
      {"none", {}, a4, 0, 0},
      {"three 10x15 on a sheet", {7, {100, 150}}, a4, 0, 3},
      {"four 9x13", {4, {90, 130}}, a4, 0, 1},
      {"lying ones as well", {4, {130, 90}}, a4, 0, 1},
      {"upright and lying", {{90, 130}, {130, 90}, {90, 130}, {130, 90}}, a4, 0, 1},
      {"two 13x18", {3, {130, 180}}, a4, 0, 2},
      {"two 13x18 on a little more", {4, {130, 180}}, {200, 310}, 0, 2},
      {"passports", {30, {35, 45}}, a4, 0, 1},
      {"more passports than the area holds", {37, {35, 45}}, a4, 0, 2},
      {"gaps", {4, {90, 130}}, a4, 20, 1},
      {"gaps too large", {4, {90, 130}}, a4, 21, 2},
      {"pinwheel", {{60, 40}, {40, 60}, {60, 40}, {40, 60}}, {100, 100}, 0, 1},
      {"mixed", {{130, 180}, {100, 150}, {35, 45}, {35, 45}, {35, 45}, {35, 45}}, a4, 0, 1},
      {"exactly the room", {{200, 287}}, a4, 0, 1},
      {"exactly the room, lying", {{287, 200}}, a4, 0, 1},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const auto places = PackSheets(row.sizes, row.room, row.gap);
    CheckPacking(row.sizes, row.room, row.gap, places);
    size_t sheets = 0;
    for (const PackedPlace& place : places) sheets = std::max(sheets, place.sheet + 1);
    EXPECT_EQ(sheets, row.sheets);
  }
  EXPECT_TRUE(PackSheets(std::vector<PaperSize>{{201, 287}}, a4, 0).empty());
}

TEST(PackSheets, ManyPrintsAreFast) {
  const std::vector<PaperSize> sizes(20000, {100, 150});
  const auto places = PackSheets(sizes, {200, 287}, 0);
  EXPECT_EQ(places.back().sheet, 6666u);
  // two sizes; the small ones fill the sheets of the large ones
  std::vector<PaperSize> mixed(60000, {100, 150});
  mixed.resize(90000, {35, 45});
  EXPECT_EQ(PackSheets(mixed, {200, 287}, 0)[59999].sheet, 19999u);
}

TEST(PhotoPages, HasALimitOfPrints) {
  const std::vector<PagePicture> pictures{{.id = 0, .width = 4, .height = 3},
                                          {.id = 1, .width = 4, .height = 3}};
  PhotoOptions options;
  options.cutLines = false;
  options.sizes = {{.size = {100, 150}, .copies = 60000}};
  EXPECT_EQ(PhotoPages(options, pictures).size(), 20000u);
}

TEST(PhotoPages, PrintsMeasureWhatTheySay) {
  const std::vector<PagePicture> pictures{{.id = 0, .width = 4000, .height = 3000},
                                          {.id = 1, .width = 3000, .height = 4000}};
  PhotoOptions options;
  options.sizes = {{.size = {100, 150}}, {.size = {35, 45}, .upright = true, .copies = 2}};
  const std::vector<Page> pages = PhotoPages(options, pictures);
  int32_t prints = 0, passports = 0;
  for (const Page& page : pages) {
    EXPECT_EQ(page.width, 210);
    for (const PageItem& item : page.items) {
      const auto* const picture = std::get_if<PictureItem>(&item);
      if (picture == nullptr) continue;
      const Box seen = BoundsOf(picture->clip);
      const double across = std::hypot(picture->across.x, picture->across.y),
                   down = std::hypot(picture->down.x, picture->down.y);
      const Box whole = PlaceOf(*picture);
      EXPECT_TRUE(whole.x < seen.x + kClose && whole.Right() > seen.Right() - kClose);
      EXPECT_TRUE(whole.y < seen.y + kClose && whole.Bottom() > seen.Bottom() - kClose);
      // turned, but never mirrored
      EXPECT_GT(picture->across.x * picture->down.y - picture->across.y * picture->down.x, 0);
      const bool wide = picture->picture == 0;
      EXPECT_NEAR(across / down, wide ? 4.0 / 3 : 0.75, kClose);
      if (std::abs(std::max(seen.width, seen.height) - 150) < kClose) {
        ++prints;
        EXPECT_NEAR(std::min(seen.width, seen.height), 100, kClose);
        // the long side of the picture is along that of the print
        EXPECT_NEAR(wide ? across : down, 150, kClose);
      } else {
        ++passports;
        EXPECT_NEAR(seen.width * seen.height, 35 * 45, kClose);
        // faces are never lying: the picture's height is along the 45 mm
        EXPECT_NEAR(wide ? down : across, wide ? 45 : 35, kClose);
      }
    }
  }
  EXPECT_EQ(prints, 2);
  EXPECT_EQ(passports, 4);
}

TEST(PrintPages, Sizes) {
  PagePicture picture{.width = 600, .height = 400, .dpi = 200};
  const struct {
    const char* name;
    PrintOptions options;
    Box box;
    double dpiDown = 0;
  } rows[] = {
      {"fit", {.turnPage = false}, {10, 148.5 - 190 / 3.0, 190, 190 * 2 / 3.0}},
      {"the page lies", {}, {148.5 - 277 / 2.0, 105 - 277 / 3.0, 277, 277 * 2 / 3.0}},
      {"actual", {.sizing = PrintSizing::Actual, .turnPage = false}, {66.9, 123.1, 76.2, 50.8}},
      {"actual, pixels that are not square",
       {.sizing = PrintSizing::Actual, .turnPage = false},
       {66.9, 135.8, 76.2, 25.4},
       400},
      {"half",
       {.sizing = PrintSizing::Percent, .percent = 50, .turnPage = false},
       {85.95, 135.8, 38.1, 25.4}},
      {"given, lying like the picture",
       {.sizing = PrintSizing::Given, .size = {100, 150}, .turnPage = false},
       {30, 98.5, 150, 100}},
      {"top left",
       {.sizing = PrintSizing::Actual, .across = -1, .down = -1, .turnPage = false},
       {10, 10, 76.2, 50.8}},
      {"bottom right",
       {.sizing = PrintSizing::Actual, .across = 1, .down = 1, .turnPage = false},
       {123.8, 236.2, 76.2, 50.8}},
      // 600 pixels of 3 dots at 300 dpi are 152.4 mm; 4 dots would not fit
      {"whole dots", {.turnPage = false, .wholeDots = true}, {28.8, 97.7, 152.4, 101.6}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    picture.dpiDown = row.dpiDown;
    const std::vector<Page> pages = PrintPages(row.options, {&picture, 1});
    ASSERT_EQ(pages.size(), 1u);
    ExpectBox(PlaceOf(FirstPicture(pages[0])), row.box);
  }
  // larger than the page: nothing in the margins, wherever it is
  for (const int32_t side : {-1, 0, 1}) {
    const PrintOptions large{
        .sizing = PrintSizing::Percent, .percent = 400, .across = side, .down = side};
    const PictureItem item = FirstPicture(PrintPages(large, {&picture, 1})[0]);
    ASSERT_EQ(item.clip.size(), 4u);
    ExpectBox(BoundsOf(item.clip), {10, 10, 277, 190});
  }
  // halftones keep whole dots on request only if they have one bit
  PagePicture halftone = picture;
  halftone.bits = 1;
  const PrintOptions expand{.turnPage = false, .expandHalftones = true};
  EXPECT_NEAR(PlaceOf(FirstPicture(PrintPages(expand, {&halftone, 1})[0])).width, 152.4, kClose);
  EXPECT_NEAR(PlaceOf(FirstPicture(PrintPages(expand, {&picture, 1})[0])).width, 190, kClose);
}

}  // namespace
}  // namespace fotomill::test
