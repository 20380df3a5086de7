#include "pages/raster/raster_page.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>

#include "pages/catalog_look.h"
#include "pages/model/placing.h"
#include "pages/raster/polygon_mask.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

constexpr double kPixelDpi = 25.4;  // a pixel is a millimeter

TEST(FillPolygon, CoversExactAreas) {
  const struct {
    const char* name;
    std::vector<Point> corners;
    double area;
  } rows[] = {
      {"square", {{2, 2}, {6, 2}, {6, 6}, {2, 6}}, 16},
      {"parts of pixels", {{1.25, 1.5}, {3.75, 1.5}, {3.75, 4}, {1.25, 4}}, 6.25},
      {"triangle", {{1, 1}, {9, 1}, {1, 9}}, 32},
      {"counterclockwise", {{1, 1}, {1, 9}, {9, 1}}, 32},
      {"beyond the page", {{-10, -10}, {5, -10}, {5, 5}, {-10, 5}}, 25},
      {"not convex", {{1, 1}, {9, 1}, {5, 5}, {9, 9}, {1, 9}}, 48},
      {"nothing", {{20, 20}, {30, 20}, {30, 30}}, 0},
      {"thin", {{1, 1}, {9, 1.1}, {9, 1.2}, {1, 1.1}}, 0.8},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    PolygonMask mask;
    ASSERT_EQ(FillPolygon(row.corners, 10, 10, mask), Status::Ok);
    double area = 0;
    for (int32_t y = 0; y < mask.area.height; ++y) {
      for (const uint8_t cover : mask.cover.Row(y).first(static_cast<size_t>(mask.area.width)))
        area += cover / 255.0;
    }
    EXPECT_NEAR(area, row.area, 0.05);
  }
}

// A picture whose pixels tell where they are from.
PicturePointer Ramp(int32_t width, int32_t height) {
  PicturePointer picture = MakePicture(width, height, 24);
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < width; ++x) {
      uint8_t* const pixel = picture->image.Row(y).data() + x * 3;
      pixel[0] = 77;
      pixel[1] = static_cast<uint8_t>(y * 255 / (height - 1));
      pixel[2] = static_cast<uint8_t>(x * 255 / (width - 1));
    }
  }
  return picture;
}

TEST(RasterPages, PicturesLandWhereTheyBelong) {
  const struct {
    const char* name;
    PictureItem item;
  } rows[] = {
      {"upright", {0, {20, 30}, {100, 0}, {0, 50}, {}}},
      {"quarter turn", {0, {120, 30}, {0, 100}, {-50, 0}, {}}},
      {"skewed", {0, {40, 20}, {80, 30}, {-20, 60}, {}}},
      {"clipped", {0, {20, 30}, {100, 0}, {0, 50}, CornersOf(Box{40, 40, 30, 30})}},
      {"larger than the page", {0, {-400, -300}, {1000, 0}, {0, 800}, {}}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    RasterPages pages(kPixelDpi);
    ASSERT_EQ(pages.Begin({.width = 160, .height = 140}), Status::Ok);
    RasterPicture prepared;
    const PicturePointer picture = Ramp(200, 100);
    ASSERT_EQ(PrepareRasterPicture(row.item, {160, 140}, kPixelDpi, *picture, prepared),
              Status::Ok);
    pages.Draw(prepared);
    int32_t compared = 0;
    for (const double s : {0.1, 0.45, 0.52, 0.9}) {
      for (const double t : {0.1, 0.45, 0.52, 0.9}) {
        const Point place = row.item.corner + row.item.across * s + row.item.down * t;
        const Box clip = row.item.clip.empty() ? Box{0, 0, 160, 140} : BoundsOf(row.item.clip);
        const auto x = static_cast<int32_t>(place.x), y = static_cast<int32_t>(place.y);
        const int32_t pixel = pages.Image().PixelAt(x, y);
        if (place.x < clip.x || place.x > clip.Right() || place.y < clip.y ||
            place.y > clip.Bottom()) {
          EXPECT_TRUE(pixel == 0xFFFFFF || pixel == -1);
          continue;
        }
        ++compared;
        EXPECT_NEAR(pixel >> 16 & 255, s * 255, 8) << s << ' ' << t;
        EXPECT_NEAR(pixel >> 8 & 255, t * 255, 8) << s << ' ' << t;
      }
    }
    EXPECT_GT(compared, 0);
  }
}

TEST(RasterPages, LinesAndDashes) {
  RasterPages pages(kPixelDpi);
  ASSERT_EQ(pages.Begin({.width = 40, .height = 40, .background = 0x302010}), Status::Ok);
  ASSERT_EQ(pages.Draw(LineItem{.from = {5, 10}, .to = {35, 10}, .width = 2, .color = 0xFF}),
            Status::Ok);
  ASSERT_EQ(pages.Draw(LineItem{
                .from = {20, 15}, .to = {20, 35}, .width = 0.1, .color = 0xFF00, .dash = 5}),
            Status::Ok);
  const struct {
    int32_t x, y, color;
  } pixels[] = {{4, 9, 0x102030},   {5, 9, 0xFF0000},   {34, 10, 0xFF0000}, {35, 10, 0x102030},
                {20, 8, 0x102030},  {20, 11, 0x102030}, {19, 16, 0x00FF00}, {19, 22, 0x102030},
                {19, 27, 0x00FF00}, {18, 16, 0x102030}, {20, 16, 0x102030}};
  for (const auto& pixel : pixels)
    EXPECT_EQ(pages.Image().PixelAt(pixel.x, pixel.y), pixel.color) << pixel.x << "," << pixel.y;
}

// The items of one catalog cell on a page of its own.
void DrawCell(const CatalogLook& look, const PagePicture& facts, RasterPages& pages) {
  const ContactLayout layout = LayoutOf(look, "No Such Family");
  ASSERT_EQ(pages.Begin({.width = layout.pageWidth,
                         .height = layout.pageHeight,
                         .background = layout.background}),
            Status::Ok);
  std::vector<PageItem> items;
  AddContactCell(layout, 0, facts, items);
  for (const PageItem& item : items) {
    ASSERT_EQ(pages.Draw(item), Status::Ok);
    const auto* const place = std::get_if<PictureItem>(&item);
    if (place == nullptr) continue;
    const PicturePointer picture = MakePicture(facts.width, facts.height, 24);
    RasterPicture prepared;
    const Rectangle size = PageSize(look);
    ASSERT_EQ(
        PrepareRasterPicture(*place, {size.width, size.height}, kCatalogDpi, *picture, prepared),
        Status::Ok);
    pages.Draw(prepared);
  }
}

TEST(CatalogCells, FrameAndPicture) {
  for (const bool raised : {true, false}) {
    for (const bool black : {false, true}) {
      const CatalogLook look{.columns = 1,
                             .rows = 1,
                             .cellHeight = 80,
                             .frame = raised ? CellFrame::Raised : CellFrame::Flat,
                             .blackText = black,
                             .names = false,
                             .background = 0x302010};
      RasterPages pages(kCatalogDpi);
      DrawCell(look, {.width = 96, .height = 80}, pages);
      const int32_t flat = black ? 0 : 0xA0A0A0, light = raised ? 0xFFFFFF : flat,
                    dark = raised ? 0x404040 : flat;
      const struct {
        int32_t x, y, color;
      } pixels[] = {{11, 11, 0x102030}, {12, 12, light},     {50, 12, light},
                    {12, 60, light},    {111, 60, dark},     {50, 95, dark},
                    {111, 95, dark},    {112, 95, 0x102030}, {111, 96, 0x102030},
                    {13, 13, 0x102030}, {110, 94, 0x102030}};
      for (const auto& pixel : pixels)
        EXPECT_EQ(pages.Image().PixelAt(pixel.x, pixel.y), pixel.color)
            << pixel.x << "," << pixel.y;
      EXPECT_NE(pages.Image().PixelAt(14, 93), 0x102030);
    }
  }
}

TEST(CatalogCells, PicturesAreRoundedAndCentered) {
  const CatalogLook look{
      .columns = 1, .rows = 1, .cellHeight = 80, .frame = CellFrame::None, .names = false};
  const struct {
    int32_t width, height;
    Rectangle place;
  } rows[] = {
      {300, 200, {14, 22, 96, 64}},
      {200, 300, {35, 14, 53, 80}},
      {12, 10, {14, 14, 96, 80}},
      {48, 10, {14, 44, 96, 20}},
  };
  for (const auto& row : rows) {
    const PagePicture facts{.width = row.width, .height = row.height};
    const PictureItem place =
        PlacePicture(facts, ContactArea(LayoutOf(look, "x"), 0), PictureFit::Inside, false);
    const PicturePointer picture = MakePicture(row.width, row.height, 24);
    RasterPicture prepared;
    ASSERT_EQ(PrepareRasterPicture(place, {200, 200}, kCatalogDpi, *picture, prepared), Status::Ok);
    EXPECT_EQ(prepared.area, row.place) << row.width;
  }
}

TEST(CatalogCells, NamesStayInTheirArea) {
  const CatalogLook look{.columns = 1, .rows = 1, .frame = CellFrame::None, .background = 0};
  for (const std::string& text :
       {std::string("a & b.jpg"), std::string(100, 'w'), std::string("\xff\xc0\xaf\x01\xe2\x82")}) {
    RasterPages pages(kCatalogDpi);
    const ContactLayout layout = LayoutOf(look, "No Such Family");
    ASSERT_EQ(
        pages.Begin({.width = layout.pageWidth, .height = layout.pageHeight, .background = 0}),
        Status::Ok);
    std::vector<PageItem> items;
    AddContactCell(layout, 0, {.name = text, .width = 1, .height = 1}, items);
    for (const PageItem& item : items) ASSERT_EQ(pages.Draw(item), Status::Ok);
    int32_t left = 1000, right = 0, top = 1000, bottom = 0, gray = 0;
    for (int32_t y = 0; y < pages.Image().Height(); ++y) {
      for (int32_t x = 0; x < pages.Image().Width(); ++x) {
        const int32_t pixel = pages.Image().PixelAt(x, y);
        if (pixel == 0) continue;
        left = std::min(left, x), right = std::max(right, x), top = std::min(top, y),
        bottom = std::max(bottom, y);
        gray += pixel != 0xFFFFFF;
      }
    }
    // The cell ends at row 12 + 2 + 96; the text is 3 to 18 below it.
    EXPECT_TRUE(top >= 113 && bottom < 128 && left >= 14 && right < 110) << text;
    EXPECT_NEAR(left - 14, 109 - right, 3) << text;
    EXPECT_GT(gray, 0) << text;
  }
}

}  // namespace
}  // namespace fotomill::test
