#include "desktop/models/browser/selection.h"

#include <algorithm>

namespace fotomill::desktop {

void Selection::Reset(size_t count) { Assign(std::vector<bool>(count), kNoLine, kNoLine); }

void Selection::Assign(std::vector<bool> selected, size_t focus, size_t anchor) {
  selected_ = std::move(selected);
  selectedCount_ = static_cast<size_t>(std::count(selected_.begin(), selected_.end(), true));
  focus_ = focus < Count() ? focus : kNoLine;
  anchor_ = anchor < Count() ? anchor : kNoLine;
  beforeBand_.clear();
}

std::vector<size_t> Selection::SelectedLines() const {
  std::vector<size_t> lines;
  lines.reserve(selectedCount_);
  for (size_t line = 0; line < Count(); ++line) {
    if (selected_[line]) lines.push_back(line);
  }
  return lines;
}

void Selection::Click(size_t line, bool shift, bool control) {
  if (line >= Count()) return;
  if (shift && anchor_ != kNoLine) {
    SelectRange(anchor_, line, control);
  } else if (control) {
    Set(line, !selected_[line]);
    anchor_ = line;
  } else {
    SelectOnly(line);
  }
  focus_ = line;
}

void Selection::ContextClick(size_t line) {
  if (line >= Count()) return;
  if (!selected_[line]) SelectOnly(line);
  focus_ = line;
}

void Selection::MoveFocus(size_t line, bool shift, bool control) {
  if (line >= Count()) return;
  if (shift) {
    if (anchor_ == kNoLine) anchor_ = focus_ == kNoLine ? line : focus_;
    SelectRange(anchor_, line, control);
  } else if (!control) {
    SelectOnly(line);
  }
  focus_ = line;
}

void Selection::ToggleFocus() {
  if (focus_ == kNoLine) return;
  Set(focus_, !selected_[focus_]);
  anchor_ = focus_;
}

void Selection::SelectOnly(size_t line) {
  SelectNone();
  Set(line, true);
  focus_ = anchor_ = line;
}

void Selection::SelectAll() {
  std::fill(selected_.begin(), selected_.end(), true);
  selectedCount_ = Count();
}

void Selection::SelectNone() {
  std::fill(selected_.begin(), selected_.end(), false);
  selectedCount_ = 0;
}

void Selection::Invert() {
  selected_.flip();
  selectedCount_ = Count() - selectedCount_;
}

void Selection::Set(size_t line, bool selected) {
  if (line >= Count() || selected_[line] == selected) return;
  selected_[line] = selected;
  selectedCount_ = selected ? selectedCount_ + 1 : selectedCount_ - 1;
}

void Selection::SelectRange(size_t from, size_t to, bool keep) {
  if (!keep) SelectNone();
  for (size_t line = std::min(from, to); line <= std::max(from, to); ++line) Set(line, true);
}

void Selection::BeginBand(bool keep) {
  if (!keep) SelectNone();
  beforeBand_ = selected_;
}

void Selection::MoveBand(std::span<const size_t> inside) {
  if (beforeBand_.size() != Count()) return;
  selected_ = beforeBand_;
  for (const size_t line : inside) {
    if (line < Count()) selected_[line] = true;
  }
  selectedCount_ = static_cast<size_t>(std::count(selected_.begin(), selected_.end(), true));
}

}  // namespace fotomill::desktop
