#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "desktop/models/browser/selection.h"

namespace fotomill::desktop {

// A rectangle of the list, in pixels; right and bottom edges are outside.
struct Rect {
  int32_t x = 0, y = 0, width = 0, height = 0;

  // A point on the right or bottom edge is outside.
  bool Contains(int32_t px, int32_t py) const {
    return px >= x && py >= y && px < x + width && py < y + height;
  }
  bool operator==(const Rect&) const = default;
};

// Where a key takes the focus.
enum class Step { Left, Right, Up, Down, PageUp, PageDown, First, Last };

// Where the cells of a thumbnail list lie: rows of equal cells, as many to a row as fit, in a
// window that scrolls downward. All in pixels of the window; y of cells counts from the list's top,
// whatever is scrolled.
class CellLayout {
 public:
  // Cells of that size, `spread` apart at least; a row's spare width is shared out between them.
  void SetCells(int32_t width, int32_t height, int32_t gap);
  void SetWindow(int32_t width, int32_t height);  // the part of the list that is seen
  void SetCount(size_t count) { count_ = count; }  // lines

  // The grid, and how far down a window can scroll so that no room is left below the last row.
  int32_t Columns() const { return columns_; }
  // The last one may be short.
  int64_t Rows() const { return (static_cast<int64_t>(count_) + columns_ - 1) / columns_; }
  int32_t RowHeight() const { return cellHeight_ + gap_; }  // with the gap to the next
  // With the gap above the first row.
  int64_t TotalHeight() const { return Rows() * RowHeight() + gap_; }
  int64_t LargestScroll() const;

  // Where a line's cell is in the list.
  Rect Cell(size_t line) const;
  // The line whose cell is at a point of the list, kNoLine between cells.
  size_t LineAt(int32_t x, int64_t y) const;
  // Lines from the first up to and without the last that a window scrolled by `scroll` shows, in
  // part at least.
  struct Range {
    size_t first = 0, end = 0;
  };
  // rows in part included
  Range Visible(int64_t scroll) const { return LinesBetween(scroll, scroll + windowHeight_); }
  // Lines whose rows touch the band between two heights.
  Range LinesBetween(int64_t top, int64_t bottom) const;
  // Lines whose cells touch a rectangle of the list: the rubber band.
  std::vector<size_t> LinesIn(const Rect& band) const;
  // Where a step takes the focus; kNoLine counts as before the first line.
  size_t Move(size_t line, Step step) const;
  // The scroll position nearest to `scroll` that shows a line's cell whole.
  int64_t ScrollToShow(size_t line, int64_t scroll) const;

 private:
  size_t count_ = 0;
  int32_t cellWidth_ = 1, cellHeight_ = 1, gap_ = 0;
  int32_t windowWidth_ = 1, windowHeight_ = 1;
  int32_t columns_ = 1;
};

}  // namespace fotomill::desktop
