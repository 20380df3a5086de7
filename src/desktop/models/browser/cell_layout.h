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
// scrolls vertically. In pixels; the y of cells is relative to the top of the list, regardless of
// scrolling.
class CellLayout {
 public:
  // Sets the cell size and minimum gap; the spare width of a row is distributed between cells.
  void SetCells(int32_t width, int32_t height, int32_t gap);
  void SetWindow(int32_t width, int32_t height);   // the visible part of the list
  void SetCount(size_t count) { count_ = count; }  // number of lines

  // The grid, and the maximum scroll position, at which the last row touches the bottom.
  int32_t Columns() const { return columns_; }
  // The last row may be incomplete.
  int64_t Rows() const { return (static_cast<int64_t>(count_) + columns_ - 1) / columns_; }
  int32_t RowHeight() const { return cellHeight_ + gap_; }  // including the gap to the next row
  // Including the gap above the first row.
  int64_t TotalHeight() const { return Rows() * RowHeight() + gap_; }
  int64_t LargestScroll() const;

  // A line's cell.
  Rect Cell(size_t line) const;
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
  size_t count_ = 0;
  int32_t cellWidth_ = 1, cellHeight_ = 1, gap_ = 0;
  int32_t windowWidth_ = 1, windowHeight_ = 1;
  int32_t columns_ = 1;
};

}  // namespace fotomill::desktop
