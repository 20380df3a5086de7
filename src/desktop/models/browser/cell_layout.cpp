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
  PlaceGroups();
}

void CellLayout::SetCount(size_t count) {
  count_ = count;
  SetGroups({}, 0);
}

void CellLayout::SetGroups(std::vector<size_t> firstLines, int32_t headingHeight) {
  headingHeight_ = firstLines.empty() ? 0 : std::max(headingHeight, 0);
  if (firstLines.empty()) firstLines.push_back(0);
  groups_.clear();
  for (size_t i = 0; i < firstLines.size(); ++i) {
    const size_t end = i + 1 < firstLines.size() ? firstLines[i + 1] : count_;
    groups_.push_back({firstLines[i], end, 0});
  }
  PlaceGroups();
}

// --- groups ---

void CellLayout::PlaceGroups() {
  int64_t top = 0;
  for (Group& group : groups_) {
    group.top = top;
    top += headingHeight_ + RowsOf(group) * RowHeight();
  }
}

int64_t CellLayout::RowsOf(const Group& group) const {
  return (static_cast<int64_t>(group.end - group.first) + columns_ - 1) / columns_;
}

int64_t CellLayout::Rows() const {
  int64_t rows = 0;
  for (const Group& group : groups_) rows += RowsOf(group);
  return rows;
}

int64_t CellLayout::TotalHeight() const {
  const Group& last = groups_.back();
  return last.top + headingHeight_ + RowsOf(last) * RowHeight() + gap_;
}

size_t CellLayout::GroupOfLine(size_t line) const {
  const auto after = std::ranges::upper_bound(groups_, line, {}, &Group::first);
  return static_cast<size_t>(after - groups_.begin()) - (after == groups_.begin() ? 0 : 1);
}

size_t CellLayout::GroupAt(int64_t y) const {
  const auto after = std::ranges::upper_bound(groups_, y, {}, &Group::top);
  return static_cast<size_t>(after - groups_.begin()) - (after == groups_.begin() ? 0 : 1);
}

// The first line of a row, at most the end of the group.
size_t CellLayout::LineOfRow(const Group& group, int64_t row) const {
  const auto place = static_cast<size_t>(std::max<int64_t>(row, 0) * columns_);
  return std::min(group.first + place, group.end);
}

Rect CellLayout::Heading(size_t group) const {
  return {gap_, static_cast<int32_t>(groups_[group].top) + gap_, windowWidth_ - 2 * gap_,
          headingHeight_ - gap_};
}

int64_t CellLayout::LargestScroll() const {
  return std::max<int64_t>(TotalHeight() - windowHeight_, 0);
}

Rect CellLayout::Cell(size_t line) const {
  const Group& group = groups_[GroupOfLine(line)];
  const size_t place = line - group.first;
  const int64_t row = static_cast<int64_t>(place) / columns_;
  const int32_t column = static_cast<int32_t>(place % static_cast<size_t>(columns_));
  const int32_t spare = std::max(windowWidth_ - gap_ - columns_ * (cellWidth_ + gap_), 0);
  Rect cell;
  cell.x = gap_ + column * (cellWidth_ + gap_) + spare * (2 * column + 1) / (2 * columns_);
  cell.y = static_cast<int32_t>(group.top + headingHeight_ + gap_ + row * RowHeight());
  cell.width = cellWidth_;
  cell.height = cellHeight_;
  return cell;
}

size_t CellLayout::LineAt(int32_t x, int64_t y) const {
  const Group& group = groups_[GroupAt(y)];
  const int64_t inside = y - group.top - headingHeight_ - gap_;
  if (inside < 0) return kNoLine;
  const size_t first = LineOfRow(group, inside / RowHeight());
  for (size_t line = first; line < std::min(first + static_cast<size_t>(columns_), group.end);
       ++line) {
    if (Cell(line).Contains(x, static_cast<int32_t>(y))) return line;
  }
  return kNoLine;
}

CellLayout::Range CellLayout::LinesBetween(int64_t top, int64_t bottom) const {
  const auto rowAt = [&](const Group& group, int64_t y) {
    return std::max<int64_t>(y - group.top - headingHeight_ - gap_, 0);
  };
  const Group& first = groups_[GroupAt(std::max<int64_t>(top, 0))];
  const Group& last = groups_[GroupAt(std::max<int64_t>(bottom, 0))];
  const size_t begin = LineOfRow(first, rowAt(first, top) / RowHeight());
  const size_t end = LineOfRow(last, (rowAt(last, bottom) + RowHeight() - 1) / RowHeight());
  return {begin, std::max(end, begin)};
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

// The line in the row above or below, in the same column if there is one; the line itself in the
// first or last row. A step down into a short row ends at its last cell.
size_t CellLayout::Above(size_t line) const {
  const size_t number = GroupOfLine(line), columns = static_cast<size_t>(columns_);
  const size_t place = line - groups_[number].first;
  if (place >= columns) return line - columns;
  if (number == 0) return line;
  const Group& other = groups_[number - 1];
  const size_t count = other.end - other.first;
  return other.first + std::min((count - 1) / columns * columns + place, count - 1);
}

size_t CellLayout::Below(size_t line) const {
  const size_t number = GroupOfLine(line), columns = static_cast<size_t>(columns_);
  const Group& group = groups_[number];
  const size_t place = line - group.first, last = group.end - group.first - 1;
  if (place + columns <= last) return line + columns;
  if (place / columns < last / columns) return group.end - 1;
  if (number + 1 == groups_.size()) return line;
  const Group& other = groups_[number + 1];
  return other.first + std::min(place % columns, other.end - other.first - 1);
}

size_t CellLayout::Move(size_t line, Step step) const {
  if (count_ == 0) return kNoLine;
  if (line >= count_) return step == Step::Last ? count_ - 1 : 0;
  const int32_t page = std::max(windowHeight_ / RowHeight(), 1);
  const auto repeated = [&](size_t (CellLayout::*move)(size_t) const) {
    size_t now = line;
    for (int32_t row = 0; row < page; ++row) now = (this->*move)(now);
    return now;
  };
  switch (step) {
    case Step::Left: return line - std::min<size_t>(line, 1);
    case Step::Right: return std::min(line + 1, count_ - 1);
    case Step::Up: return Above(line);
    case Step::Down: return Below(line);
    case Step::PageUp: return repeated(&CellLayout::Above);
    case Step::PageDown: return repeated(&CellLayout::Below);
    case Step::First: return 0;
    case Step::Last: break;
  }
  return count_ - 1;
}

bool CellLayout::Shows(size_t line, int64_t scroll) const {
  const Rect cell = Cell(line);
  return int64_t{cell.y} + cell.height > scroll && cell.y < scroll + windowHeight_;
}

int64_t CellLayout::ScrollToShow(size_t line, int64_t scroll) const {
  const Rect cell = Cell(line);
  const Group& group = groups_[GroupOfLine(line)];
  const bool firstRow = line - group.first < static_cast<size_t>(columns_);
  const int64_t top = firstRow ? group.top : cell.y - gap_;  // with the heading
  if (top < scroll) return std::clamp<int64_t>(top, 0, LargestScroll());
  const int64_t bottom = int64_t{cell.y} + cell.height + gap_;
  if (bottom > scroll + windowHeight_)
    return std::clamp<int64_t>(bottom - windowHeight_, 0, LargestScroll());
  return std::clamp<int64_t>(scroll, 0, LargestScroll());
}

}  // namespace fotomill::desktop
