#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>

#include "core/choice_lists.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/cell_layout.h"
#include "desktop/models/browser/thumbnail_side.h"
#include "desktop/models/thumbnails/thumbnail.h"
#include "support/files.h"

namespace fotomill::desktop {
namespace {

namespace fs = std::filesystem;

TEST(CellLayout, PlacesGroupsBelowTheirHeadings) {
  CellLayout layout;
  layout.SetCells(100, 120, 4);
  layout.SetCount(12);
  layout.SetWindow(320, 300);  // 3 columns
  layout.SetGroups({0, 4, 5}, 30);
  // Rows of 124: two, one, three; each group starts with a heading of 30.
  EXPECT_EQ(layout.Rows(), 6);
  EXPECT_EQ(layout.TotalHeight(), 3 * 30 + 6 * 124 + 4);
  EXPECT_EQ(layout.Heading(1).y, 30 + 2 * 124 + 4);
  EXPECT_EQ(layout.Cell(3).y, 30 + 4 + 124);
  EXPECT_EQ(layout.Cell(4).x, layout.Cell(0).x);
  EXPECT_EQ(layout.Cell(4).y, 30 + 2 * 124 + 30 + 4);
  for (size_t line = 0; line < 12; ++line) {
    const Rect cell = layout.Cell(line);
    EXPECT_EQ(layout.LineAt(cell.x, cell.y), line);
    EXPECT_EQ(layout.LineAt(cell.x + cell.width, cell.y), kNoLine);
  }
  EXPECT_EQ(layout.LineAt(layout.Heading(1).x + 20, layout.Heading(1).y + 5), kNoLine);

  struct {
    size_t from;
    Step step;
    size_t to;
  } const rows[] = {
      {1, Step::Down, 3},  // a short row
      {3, Step::Down, 4},  // the next group
      {4, Step::Down, 5},     {2, Step::Up, 2},   {4, Step::Up, 3},    {7, Step::Up, 4},
      {6, Step::Up, 4},       {5, Step::Up, 4},   {8, Step::Up, 5},    {11, Step::Down, 11},
      {0, Step::PageDown, 4},  // two rows of 124 fit into 300
      {11, Step::PageUp, 5},  {4, Step::Left, 3}, {3, Step::Right, 4},
  };
  for (const auto& row : rows)
    EXPECT_EQ(layout.Move(row.from, row.step), row.to)
        << row.from << " " << static_cast<int>(row.step);

  // Parts of the list, with headings at their edges.
  const auto between = [&](int64_t top, int64_t bottom) {
    const CellLayout::Range range = layout.LinesBetween(top, bottom);
    return std::pair(range.first, range.end);
  };
  EXPECT_EQ(between(0, 20), std::pair(size_t{0}, size_t{0}));
  EXPECT_EQ(between(0, 40), std::pair(size_t{0}, size_t{3}));
  EXPECT_EQ(between(200, 320), std::pair(size_t{3}, size_t{5}));
  EXPECT_EQ(between(0, 100'000), std::pair(size_t{0}, size_t{12}));
  EXPECT_EQ(layout.ScrollToShow(0, 500), 0);
  EXPECT_EQ(layout.ScrollToShow(5, 800), 2 * 30 + 3 * 124);  // with its heading

  layout.SetGroups({}, 30);
  EXPECT_EQ(layout.GroupCount(), 0u);
  EXPECT_EQ(layout.TotalHeight(), 4 * 124 + 4);
}

FolderItem FileOf(const char* name, int64_t taken, int64_t modified = 0) {
  FolderItem item;
  item.name = name;
  item.taken = taken;
  item.modified = modified;
  return item;
}

TEST(BrowserModel, GroupsByDateAndKeepsTheSelection) {
  BrowserModel model;
  model.SetFolder("/p");
  FolderItem folder;
  folder.name = "z";
  folder.folder = true;
  model.SetItems({FileOf("a", 20260301'120000), FileOf("b", 20260415'120000), folder,
                  FileOf("c", 20260331'235959), FileOf("d", 0, 1577966400)});  // 2020-01-02
  EXPECT_TRUE(model.Groups().empty());
  model.Selected().SelectOnly(model.FindLine("c"));
  model.SetGrouping(DateGrouping::Month);
  const auto names = [&] {
    std::string all;
    for (size_t line = 0; line < model.LineCount(); ++line) all += model.Line(line).name;
    return all;
  };
  const auto groups = [&] {
    std::vector<std::pair<size_t, int32_t>> all;
    for (const LineGroup& group : model.Groups()) all.emplace_back(group.first, group.date);
    return all;
  };
  using Groups = std::vector<std::pair<size_t, int32_t>>;
  EXPECT_EQ(names(), "zbacd");
  EXPECT_EQ(groups(), (Groups{{0, 0}, {1, 20260400}, {2, 20260300}, {4, 20200100}}));
  EXPECT_EQ(model.Line(model.Selected().Focus()).name, "c");
  model.SetGrouping(DateGrouping::Day);
  EXPECT_EQ(names(), "zbcad");
  model.SetFilter("a");
  EXPECT_EQ(groups(), (Groups{{0, 20260301}}));
  model.SetFilter("");
  model.SetGrouping(DateGrouping::None);
  EXPECT_EQ(names(), "zabcd");
  EXPECT_TRUE(model.Groups().empty());
}

TEST(FolderListing, WithSubfoldersHasFilesOnly) {
  const test::TemporaryFolder folder;
  fs::create_directories(folder.Path("b/c"));
  fs::create_directories(folder.Path(".hidden"));
  for (const char* name : {"a.png", "b/a.png", "b/c/d.jpg", "b/text.none", ".hidden/e.png"})
    test::WriteText(folder.Path(name), "x");
  fs::create_directory_symlink(folder.Path(), folder.Path("b/loop"));
  FolderListing listing = ListWithSubfolders(folder.Path(), {});
  EXPECT_EQ(listing.state, FolderState::Listed);
  std::vector<std::string> names;
  for (const FolderItem& item : listing.items) names.push_back(item.name);
  std::ranges::sort(names);
  EXPECT_EQ(names, (std::vector<std::string>{"a.png", "b/a.png", "b/c/d.jpg"}));
  AddFacts(folder.Path(), listing, {});
  EXPECT_EQ(listing.items.back().size, 1u);
  EXPECT_EQ(ListWithSubfolders(folder.Path("none"), {}).state, FolderState::Missing);

  BrowserModel model;
  model.SetFolder(folder.Path());
  model.SetItems(std::move(listing.items));
  const std::string path = folder.Path("b/c/d.jpg");
  EXPECT_EQ(model.PathOfLine(model.LineOfPath(path)), path);
  EXPECT_EQ(ShownName(model.Line(model.FindTyped("d", false))), "d.jpg");
}

TEST(ThumbnailSide, BelongsToAView) {
  struct {
    int32_t view, wanted, side;
  } const rows[] = {
      {choice::kViewSmall, 0, 48},     {choice::kViewSmall, 64, 64},
      {choice::kViewSmall, 96, 48},    {choice::kViewNormal, 128, 128},
      {choice::kViewNormal, 256, 96},  {choice::kViewLarge, 256, 256},
      {choice::kViewLarge, 5000, 176}, {choice::kViewLarge, -1, 176},
  };
  for (const auto& row : rows) EXPECT_EQ(SideInView(row.view, row.wanted), row.side);
  EXPECT_EQ(SteppedSide(96, 1), 128);
  EXPECT_EQ(SteppedSide(96, -1), 64);
  EXPECT_EQ(SteppedSide(100, -1), 96);
  EXPECT_EQ(SteppedSide(512, 1), 512);
  EXPECT_EQ(SteppedSide(48, -3), 48);
  EXPECT_EQ(SideAtSlider(0), kSmallestSide);
  EXPECT_EQ(SideAtSlider(kSliderEnd), kLargestSide);
  for (int32_t position = 0; position < kSliderEnd; ++position)
    EXPECT_LE(SideAtSlider(position), SideAtSlider(position + 1));
  EXPECT_NEAR(SideAtSlider(SliderAtSide(256)), 256, 8);
}

TEST(FolderThumbnail, IsThatOfTheFirstReadablePicture) {
  const test::TemporaryFolder folder;
  fs::create_directories(folder.Path("sub"));
  ThumbnailRequest request;
  request.path = folder.Path("sub");
  request.folder = true;
  request.mode = choice::kVirtual;
  EXPECT_TRUE(LoadThumbnail(request)->pixels.Empty());
  test::WriteText(folder.Path("sub/a.png"), "no picture");
  fs::copy(test::SourcePath("samples/bmp-true-color.bmp"), folder.Path("sub/b.bmp"));
  EXPECT_EQ(LoadThumbnail(request)->pixels.width, 96);
}

}  // namespace
}  // namespace fotomill::desktop
