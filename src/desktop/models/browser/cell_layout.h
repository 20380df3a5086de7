#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "desktop/models/browser/selection.h"

namespace fotomill::desktop {

// A rectangle in pixels; right and bottom edges are exclusive.
struct Rect {
  int32_t x = 0, y = 0, width = 0, height = 0;

  // Points on the right or bottom edge are outside.
  bool Contains(int32_t px, int32_t py) const {
    return px >= x && py >= y && px < x + width && py < y + height;
  }
  bool operator==(const Rect&) const = default;
};

// A movement of the focus by key.
enum class Step { Left, Right, Up, Down, PageUp, PageDown, First, Last };

// The layout of a thumbnail list: rows of equal cells, as many per row as fit, in a window that
// scrolls vertically; optionally in groups, each with a heading above its first row. In pixels; the
// y of cells is relative to the top of the list, regardless of scrolling.
class CellLayout {
 public:
  // Sets the cell size and minimum gap; the spare width of a row is distributed between cells.
  void SetCells(int32_t width, int32_t height, int32_t gap);
  void SetWindow(int32_t width, int32_t height);   // the visible part of the list
  void SetCount(size_t count);                     // number of lines
  // The first line of each group, ascending from 0; none: no groups. Call after SetCount.
  void SetGroups(std::vector<size_t> firstLines, int32_t headingHeight);

  // The grid, and the maximum scroll position, at which the last row touches the bottom.
  int32_t Columns() const { return columns_; }
  // The last row of a group may be incomplete.
  int64_t Rows() const;
  int32_t RowHeight() const { return cellHeight_ + gap_; }  // including the gap to the next row
  // Including the gap above the first row.
  int64_t TotalHeight() const;
  int64_t LargestScroll() const;

  // A line's cell.
  Rect Cell(size_t line) const;
  // The groups with a heading, and its place.
  size_t GroupCount() const { return headingHeight_ > 0 ? groups_.size() : 0; }
  Rect Heading(size_t group) const;
  // The line at a point of the list; kNoLine between cells.
  size_t LineAt(int32_t x, int64_t y) const;
  // Visible lines at scroll position `scroll`, from `first` to before `end`, including partly
  // visible ones.
  struct Range {
    size_t first = 0, end = 0;
  };
  // including partly visible rows
  Range Visible(int64_t scroll) const { return LinesBetween(scroll, scroll + windowHeight_); }
  // Lines whose rows intersect a vertical range.
  Range LinesBetween(int64_t top, int64_t bottom) const;
  // Lines whose cells intersect a rectangle of the list, for rubber-band selection.
  std::vector<size_t> LinesIn(const Rect& band) const;
  // The line focused after a step; kNoLine counts as before the first line.
  size_t Move(size_t line, Step step) const;
  // Whether at least a part of a cell is visible at scroll position `scroll`.
  bool Shows(size_t line, int64_t scroll) const;
  // The scroll position closest to `scroll` at which a cell is fully visible.
  int64_t ScrollToShow(size_t line, int64_t scroll) const;

 private:
  // Lines of a group, from `first` to before `end`; `top` is the y of its heading, or of the gap
  // above its first row.
  struct Group {
    size_t first = 0, end = 0;
    int64_t top = 0;
  };
  void PlaceGroups();
  int64_t RowsOf(const Group& group) const;
  size_t GroupOfLine(size_t line) const;
  size_t GroupAt(int64_t y) const;
  size_t LineOfRow(const Group& group, int64_t row) const;
  size_t Above(size_t line) const;
  size_t Below(size_t line) const;

  std::vector<Group> groups_ = std::vector<Group>(1);  // one if there are no headings
  int32_t headingHeight_ = 0;
  size_t count_ = 0;
  int32_t cellWidth_ = 1, cellHeight_ = 1, gap_ = 0;
  int32_t windowWidth_ = 1, windowHeight_ = 1;
  int32_t columns_ = 1;
};

}  // namespace fotomill::desktop
