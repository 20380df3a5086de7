#include "desktop/models/browser/browser_model.h"
#include "desktop/models/drawing/list_palette.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "core/choice_lists.h"
#include "core/natural_order.h"
#include "desktop/models/browser/cell_layout.h"
#include "desktop/models/browser/detail_columns.h"
#include "desktop/models/browser/folder_trail.h"
#include "desktop/models/browser/path_crumbs.h"
#include "desktop/models/shell/toolbar_buttons.h"

namespace fotomill::desktop {
namespace {

TEST(NaturalOrder, NumbersCountAsNumbers) {
  const char* const inOrder[] = {"",     "1",     "2.png", "10.png", "010.pngx",
                                 "a1b2", "a1b10", "B",     "b2",     "c"};
  for (size_t i = 0; i + 1 < std::size(inOrder); ++i) {
    SCOPED_TRACE(inOrder[i]);
    EXPECT_LT(CompareNatural(inOrder[i], inOrder[i + 1]), 0);
    EXPECT_GT(CompareNatural(inOrder[i + 1], inOrder[i]), 0);
  }
  // Numbers beyond any integer type, and names that differ only in case or zeros,
  // are still ordered.
  EXPECT_LT(CompareNatural("99999999999999999999999", "100000000000000000000000"), 0);
  EXPECT_NE(CompareNatural("A", "a"), 0);
  EXPECT_NE(CompareNatural("a01", "a1"), 0);
}

TEST(Filter, PartsAndWildcards) {
  struct {
    const char* name;
    const char* pattern;
    bool matches;
  } const rows[] = {
      {"Beach.JPG", "", true},      {"Beach.JPG", "each", true},    {"Beach.JPG", "*.jpg", true},
      {"Beach.JPG", "jpg*", false}, {"Beach.JPG", "b?ach.*", true}, {"Beach.JPG", "b?ach", false},
      {"aab", "*a*b", true},        {"aaab", "*ab", true},          {"x", "**", true},
      {"x", "xy", false},
  };
  for (const auto& row : rows)
    EXPECT_EQ(MatchesFilter(row.name, row.pattern), row.matches) << row.name << " " << row.pattern;
}

std::vector<FolderItem> Items(std::initializer_list<const char*> names) {
  std::vector<FolderItem> items;
  for (const char* name : names) {
    FolderItem item;
    item.name = name;
    item.folder = item.name.find('.') == std::string::npos;
    item.size = 100 * items.size();
    items.push_back(item);
  }
  return items;
}

// Names of the lines, selected ones with a star, the focused one in brackets.
std::string Shown(const BrowserModel& model) {
  std::string text;
  for (size_t line = 0; line < model.LineCount(); ++line) {
    const std::string name = model.Line(line).name + (model.Selected().IsSelected(line) ? "*" : "");
    text +=
        (text.empty() ? "" : " ") + (model.Selected().Focus() == line ? "[" + name + "]" : name);
  }
  return text;
}

TEST(BrowserModel, SelectionSurvivesSortingFilteringAndRelisting) {
  BrowserModel model;
  model.SetFolder("/p");
  model.SetItems(Items({"b10.png", "sub", "b2.png", "a.gif"}));
  EXPECT_EQ(Shown(model), "sub a.gif b2.png b10.png");
  model.Selected().Click(1, false, false);
  model.Selected().Click(3, true, false);
  EXPECT_EQ(Shown(model), "sub a.gif* b2.png* [b10.png*]");
  model.SetSort(choice::kSortSize, false);
  EXPECT_EQ(Shown(model), "sub [b10.png*] b2.png* a.gif*");
  model.SetSort(choice::kSortSize, true);
  EXPECT_EQ(Shown(model), "sub a.gif* b2.png* [b10.png*]");  // folders first, whatever the direction
  model.SetFilter("*.png");
  EXPECT_EQ(Shown(model), "b2.png* [b10.png*]");
  model.SetSort(choice::kSortName, false);
  model.SetFilter("");
  EXPECT_EQ(Shown(model), "sub a.gif b2.png* [b10.png*]") << "what a filter hides is not selected behind it";
  EXPECT_EQ(model.FilesForFunction(), (std::vector<std::string>{"/p/b2.png", "/p/b10.png"}));
  model.SetItems(Items({"b10.png", "c.gif", "b2.png", "sub"}));
  EXPECT_EQ(Shown(model), "sub b2.png* [b10.png*] c.gif");
}

TEST(BrowserModel, FocusMovesToTheNextFileIfItsFileIsDeleted) {
  BrowserModel model;
  model.SetItems(Items({"a.png", "b.png", "c.png"}));
  model.Selected().SelectOnly(1);
  model.SetItems(Items({"a.png", "c.png"}));
  EXPECT_EQ(Shown(model), "a.png [c.png*]");
  model.SetItems(Items({"a.png"}));
  EXPECT_EQ(Shown(model), "[a.png*]");
  model.SetItems({});
  EXPECT_TRUE(model.FilesForFunction().empty());
  EXPECT_EQ(model.CountText(), "0 files");
}

TEST(BrowserModel, FocusSkipsAllDeletedFiles) {
  BrowserModel model;
  model.SetItems(Items({"a.png", "b.png", "c.png", "d.png", "e.png"}));
  model.Selected().SelectOnly(1);
  model.Selected().MoveFocus(2, true, false);
  model.SetItems(Items({"a.png", "d.png", "e.png"}));
  EXPECT_EQ(Shown(model), "a.png [d.png*] e.png");
  // Exactly the named lines; without any, the next command has no file.
  model.SelectNames({"e.png", "gone.png", "a.png"});
  EXPECT_EQ(Shown(model), "[a.png*] d.png e.png*");
  model.SelectNames({"gone.png"});
  EXPECT_EQ(Shown(model), "a.png d.png e.png");
  EXPECT_TRUE(model.PathsForFunction().empty());
}

TEST(BrowserModel, KeepsFactsOfUnchangedFiles) {
  BrowserModel model;
  model.SetItems(Items({"a.png"}));
  FolderItem known = model.Item(0);
  known.width = 7;
  model.SetFacts(0, known);
  model.SetItems(Items({"a.png"}));
  EXPECT_EQ(model.Item(0).width, 7);
  auto changed = Items({"a.png"});
  changed[0].modified = 5;
  model.SetItems(changed);
  EXPECT_EQ(model.Item(0).width, 0);
}

TEST(PathBar, CrumbsAndTrail) {
  EXPECT_EQ(CrumbsOf("/a/b c"), (std::vector<Crumb>{{"/", "/"}, {"a", "/a"}, {"b c", "/a/b c"}}));
  EXPECT_EQ(CrumbsOf("/"), (std::vector<Crumb>{{"/", "/"}}));
  const int widths[] = {30, 50, 40};
  struct {
    int room;
    size_t first;
  } const rows[] = {{120, 0}, {119, 1}, {110, 1}, {109, 2}, {0, 2}};
  for (const auto& row : rows)
    EXPECT_EQ(FirstCrumbShown(widths, row.room, 20), row.first) << row.room;

  const std::vector<std::string> names = {"Sub", "sub1", "sub2", "other", "s\xFF"};
  EXPECT_EQ(Completions("/a/s", names), (std::vector<std::string>{"/a/sub1", "/a/sub2", "/a/Sub"}));
  for (const char* complete : {"/a/", "/a/other", "/a/x", ""})
    EXPECT_TRUE(Completions(complete, names).empty()) << complete;

  FolderTrail trail;
  for (const char* folder : {"/a", "/b", "/c"}) trail.Go(folder);
  EXPECT_EQ(trail.Step(-2), "/a");
  EXPECT_FALSE(trail.CanStep(-1));
  EXPECT_TRUE(trail.CanStep(2));
  trail.Go("/d");
  EXPECT_FALSE(trail.CanStep(1));
  for (int i = 0; i < 150; ++i) trail.Go("/" + std::to_string(i));
  EXPECT_TRUE(trail.CanStep(-99));
  EXPECT_FALSE(trail.CanStep(-100));
  EXPECT_EQ(trail.FolderAt(-99), "/50");
}

TEST(DetailColumns, AreConfiguredByText) {
  const DetailColumns all = ParseDetailColumns("");
  ASSERT_EQ(all.size(), AllDetails().size());
  const DetailColumns arranged =
      ParseDetailColumns("Size:99,-Name:300,nonsense,-Type:9999999,Size:1,Depth:x,Gone:3");
  ASSERT_EQ(arranged.size(), all.size());
  EXPECT_EQ(arranged[0], (DetailColumn{2, 99, true}));
  EXPECT_EQ(arranged[1], (DetailColumn{0, 300, true}));  // the name column cannot be hidden
  EXPECT_EQ(arranged[2], (DetailColumn{1, 4000, false}));
  EXPECT_EQ(arranged[3], all[3]);
  EXPECT_EQ(ParseDetailColumns(DetailColumnsText(arranged)), arranged);
  FolderItem item;
  item.taken = 20040831223208;
  EXPECT_TRUE(std::ranges::any_of(
      AllDetails(), [&](const auto& detail) { return detail.text(item) == "2004-08-31 22:32"; }));
}

TEST(BrowserModel, TypingFinds) {
  BrowserModel model;
  model.SetItems(Items({"ab.png", "ac.png", "b.png", "Ad.png"}));
  model.Selected().MoveFocus(0, false, true);
  EXPECT_EQ(model.FindTyped("a", true), 1u);
  EXPECT_EQ(model.FindTyped("ac", false), 1u);
  EXPECT_EQ(model.FindTyped("ad", false), 2u);
  EXPECT_EQ(model.FindTyped("x", true), kNoLine);
  model.SelectMatching("*c.png", MatchMode::Only);
  model.SelectMatching("a*", MatchMode::Add);
  model.SelectMatching("ad", MatchMode::Remove);
  EXPECT_EQ(Shown(model), "[ab.png*] ac.png* Ad.png b.png");
  model.SelectMatching("", MatchMode::Only);
  EXPECT_EQ(model.CountText(), "4 files, 600 bytes");
  EXPECT_EQ(model.FocusText(), "ab.png, 1 of 4");
}

TEST(Toolbar, KeepsItsButtonsAndAddsNewOnes) {
  const std::vector<ToolbarButton> known{
      {"view", true}, {"convert", true}, {"info", true}, {"setup", true},
      {"Edit/Undo", false}, {"Edit/Redo", false}};
  const std::vector<ToolbarButton> expected{
      {"setup", true}, {"view", false}, {"Edit/Redo", true}, {"convert", true},
      {"info", true}, {"Edit/Undo", false}};
  EXPECT_EQ(ParseToolbar("setup\r\n-view\ngone\nsetup\n-\nEdit/Redo\nconvert\n", known), expected);
  EXPECT_EQ(ParseToolbar("", known), known);
}

// The system's colors: background, text, highlight and its text.
TEST(Palette, EveryTextIsReadable) {
  const Shade systems[][4] = {
      {{255, 255, 255}, {0, 0, 0}, {0x35, 0x84, 0xe4}, {255, 255, 255}},           // light
      {{0x2d, 0x2d, 0x2d}, {255, 255, 255}, {0x15, 0x53, 0x9e}, {255, 255, 255}},  // dark
      {{0, 0, 0}, {255, 255, 255}, {255, 255, 255}, {0, 0, 0}},                    // high contrast
      {{0x80, 0x80, 0x80}, {0x90, 0x90, 0x90}, {0x70, 0x70, 0x70}, {0x88, 0x88, 0x88}},
      {{0xfd, 0xf6, 0xe3}, {0x65, 0x7b, 0x83}, {0xee, 0xe8, 0xd5}, {0x58, 0x6e, 0x75}},
  };
  EXPECT_NEAR(Contrast({0, 0, 0}, {255, 255, 255}), 21, 1e-9);
  for (const auto& [background, text, highlight, highlightText] : systems) {
    const ListPalette p = PaletteOf(background, text, highlight, highlightText);
    for (const auto& [ink, ground] : {std::pair(p.text, p.background),
                                      {p.selectedText, p.selected},
                                      {p.restingText, p.resting},
                                      {p.note, p.background},
                                      {p.note, p.faint},
                                      {p.fault, p.background},
                                      {p.fault, p.faint}}) {
      EXPECT_GE(Contrast(ink, ground), kReadable) << int(ink.red) << " on " << int(ground.red);
    }
  }
  EXPECT_EQ(PaletteOf(systems[1][0], systems[1][1], systems[1][2], systems[1][3]).selected,
            systems[1][2]);  // kept if possible
}

TEST(Selection, MouseAndKeyboard) {
  Selection selection;
  selection.Reset(8);
  const auto lines = [&] { return selection.SelectedLines(); };
  using Lines = std::vector<size_t>;
  selection.Click(2, false, false);
  selection.Click(5, true, false);
  EXPECT_EQ(lines(), (Lines{2, 3, 4, 5}));
  selection.Click(1, true, false);  // the anchor stays
  EXPECT_EQ(lines(), (Lines{1, 2}));
  selection.Click(6, false, true);
  selection.Click(7, true, true);
  EXPECT_EQ(lines(), (Lines{1, 2, 6, 7}));
  selection.Click(6, false, true);
  EXPECT_EQ(lines(), (Lines{1, 2, 7}));
  selection.MoveFocus(3, false, true);  // only the focus
  EXPECT_EQ(lines(), (Lines{1, 2, 7}));
  selection.ToggleFocus();
  selection.MoveFocus(4, true, false);
  EXPECT_EQ(lines(), (Lines{3, 4}));
  selection.ContextClick(4);
  EXPECT_EQ(lines(), (Lines{3, 4}));
  selection.ContextClick(0);
  EXPECT_EQ(lines(), (Lines{0}));
  selection.Invert();
  EXPECT_EQ(selection.SelectedCount(), 7u);
  selection.SelectOnly(1);
  selection.BeginBand(true);
  selection.MoveBand(Lines{4, 5});
  selection.MoveBand(Lines{5, 99});
  EXPECT_EQ(lines(), (Lines{1, 5}));
}

TEST(CellLayout, HundredThousandCells) {
  CellLayout layout;
  layout.SetCells(100, 120, 4);
  layout.SetCount(100'001);
  layout.SetWindow(550, 400);  // 5 columns, 26 pixels left over
  EXPECT_EQ(layout.Columns(), 5);
  EXPECT_EQ(layout.Rows(), 20'001);
  const Rect last = layout.Cell(100'000);
  EXPECT_EQ(layout.LineAt(last.x, last.y), 100'000u);
  EXPECT_EQ(layout.LineAt(last.x - 3, last.y), kNoLine);
  EXPECT_EQ(layout.LineAt(last.x + 200, last.y), kNoLine);  // beyond the last one
  const auto end = layout.Visible(layout.LargestScroll());
  EXPECT_EQ(end.end, 100'001u);
  EXPECT_LE(end.end - end.first, 25u);
  EXPECT_EQ(layout.LinesIn({0, 0, 220, 130}), (std::vector<size_t>{0, 1, 5, 6}));

  struct {
    size_t from;
    Step step;
    size_t to;
  } const rows[] = {
      {0, Step::Left, 0},
      {0, Step::Up, 0},
      {3, Step::Up, 3},
      {7, Step::Up, 2},
      {4, Step::Right, 5},
      {2, Step::PageDown, 17},
      {17, Step::PageUp, 2},
      {7, Step::PageUp, 2},
      {kNoLine, Step::Down, 0},
      {99'999, Step::Down, 100'000},
      {100'000, Step::Down, 100'000},
      {5, Step::Last, 100'000},
  };
  for (const auto& row : rows)
    EXPECT_EQ(layout.Move(row.from, row.step), row.to) << row.from << " " << static_cast<int>(row.step);
  EXPECT_EQ(layout.ScrollToShow(0, 5000), 0);
  EXPECT_EQ(layout.ScrollToShow(100'000, 0), layout.LargestScroll());
  EXPECT_EQ(layout.ScrollToShow(6, 30), 30);
}

}  // namespace
}  // namespace fotomill::desktop
