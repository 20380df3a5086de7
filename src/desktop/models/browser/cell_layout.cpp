#include "desktop/models/browser/cell_layout.h"

#include <algorithm>

namespace fotomill::desktop {

void CellLayout::SetCells(int32_t width, int32_t height, int32_t gap) {
  cellWidth_ = std::max(width, 1);
  cellHeight_ = std::max(height, 1);
  gap_ = std::max(gap, 0);
  SetWindow(windowWidth_, windowHeight_);
}

void CellLayout::SetWindow(int32_t width, int32_t height) {
  windowWidth_ = std::max(width, 1);
  windowHeight_ = std::max(height, 1);
  columns_ = std::max((windowWidth_ - gap_) / (cellWidth_ + gap_), 1);
}

int64_t CellLayout::LargestScroll() const {
  return std::max<int64_t>(TotalHeight() - windowHeight_, 0);
}

Rect CellLayout::Cell(size_t line) const {
  const int64_t row = static_cast<int64_t>(line) / columns_;
  const int32_t column = static_cast<int32_t>(line % static_cast<size_t>(columns_));
  const int32_t spare = std::max(windowWidth_ - gap_ - columns_ * (cellWidth_ + gap_), 0);
  Rect cell;
  cell.x = gap_ + column * (cellWidth_ + gap_) + spare * (2 * column + 1) / (2 * columns_);
  cell.y = static_cast<int32_t>(gap_ + row * RowHeight());
  cell.width = cellWidth_;
  cell.height = cellHeight_;
  return cell;
}

size_t CellLayout::LineAt(int32_t x, int64_t y) const {
  if (y < gap_) return kNoLine;
  const size_t first =
      static_cast<size_t>((y - gap_) / RowHeight()) * static_cast<size_t>(columns_);
  for (size_t line = first; line < std::min(first + static_cast<size_t>(columns_), count_);
       ++line) {
    if (Cell(line).Contains(x, static_cast<int32_t>(y))) return line;
  }
  return kNoLine;
}

CellLayout::Range CellLayout::LinesBetween(int64_t top, int64_t bottom) const {
  const int64_t firstRow = std::max<int64_t>(top - gap_, 0) / RowHeight();
  const int64_t endRow = std::max<int64_t>(bottom - gap_ + RowHeight() - 1, 0) / RowHeight();
  const auto line = [&](int64_t row) {
    return std::min(static_cast<size_t>(row * columns_), count_);
  };
  return {line(firstRow), std::max(line(endRow), line(firstRow))};
}

std::vector<size_t> CellLayout::LinesIn(const Rect& band) const {
  std::vector<size_t> lines;
  const Range rows = LinesBetween(band.y, int64_t{band.y} + band.height);
  for (size_t line = rows.first; line < rows.end; ++line) {
    const Rect cell = Cell(line);
    const bool apart = cell.x >= band.x + band.width || cell.x + cell.width <= band.x ||
                       cell.y >= band.y + band.height || cell.y + cell.height <= band.y;
    if (!apart) lines.push_back(line);
  }
  return lines;
}

size_t CellLayout::Move(size_t line, Step step) const {
  if (count_ == 0) return kNoLine;
  if (line >= count_) return step == Step::Last ? count_ - 1 : 0;
  const int64_t last = static_cast<int64_t>(count_) - 1;
  const int64_t page = int64_t{std::max(windowHeight_ / RowHeight(), 1)} * columns_;
  const int64_t from = static_cast<int64_t>(line);
  // Vertical steps keep the column; if there is no cell there, up does not move, and down moves to
  // the last one.
  const auto rows = [&](int64_t distance) {
    if (from + distance < 0) return distance == -columns_ ? from : from % columns_;
    if (from + distance <= last) return from + distance;
    return from / columns_ == last / columns_ ? from : last;
  };
  switch (step) {
    case Step::Left: return static_cast<size_t>(std::max<int64_t>(from - 1, 0));
    case Step::Right: return static_cast<size_t>(std::min(from + 1, last));
    case Step::Up: return static_cast<size_t>(rows(-columns_));
    case Step::Down: return static_cast<size_t>(rows(columns_));
    case Step::PageUp: return static_cast<size_t>(rows(-page));
    case Step::PageDown: return static_cast<size_t>(rows(page));
    case Step::First: return 0;
    case Step::Last: break;
  }
  return static_cast<size_t>(last);
}

bool CellLayout::Shows(size_t line, int64_t scroll) const {
  const Rect cell = Cell(line);
  return int64_t{cell.y} + cell.height > scroll && cell.y < scroll + windowHeight_;
}

int64_t CellLayout::ScrollToShow(size_t line, int64_t scroll) const {
  const Rect cell = Cell(line);
  if (cell.y - gap_ < scroll) return std::clamp<int64_t>(cell.y - gap_, 0, LargestScroll());
  const int64_t bottom = int64_t{cell.y} + cell.height + gap_;
  if (bottom > scroll + windowHeight_)
    return std::clamp<int64_t>(bottom - windowHeight_, 0, LargestScroll());
  return std::clamp<int64_t>(scroll, 0, LargestScroll());
}

}  // namespace fotomill::desktop
