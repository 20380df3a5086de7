#include "desktop/models/view/overlay_layout.h"

#include <algorithm>

namespace fotomill::desktop {

OverlayLayout::OverlayLayout(const Input& input) : input_(input) {
  const int32_t room = input.width - 2 * input.margin - 2 * input.gap;
  const int32_t buttonStep = input.button + input.gap, cellStep = input.cell + input.gap;
  const int32_t buttons = static_cast<int32_t>(input.buttons) * buttonStep - input.gap;
  const int32_t buttonsHigh = input.button + 2 * input.gap;
  const int32_t least = 3 * (input.caption + buttonsHigh);
  if (input.buttons == 0 || room < buttons || input.height < least) return;
  const bool strip = input.strip && input.files > 1 && room >= 3 * cellStep &&
                     input.height >= 4 * (buttonsHigh + cellStep);
  const size_t shown =
      strip ? std::min(input.files, static_cast<size_t>((room + input.gap) / cellStep)) : 0;
  const size_t before = std::min(input.current, shown / 2);
  cells_.first = std::min(input.current - before, input.files - shown);
  cells_.end = cells_.first + shown;
  const int32_t cells = static_cast<int32_t>(shown) * cellStep - (shown > 0 ? input.gap : 0);

  bar_.width = std::max(buttons, cells) + 2 * input.gap;
  bar_.height = input.caption + buttonsHigh + (shown > 0 ? cellStep : 0);
  bar_.x = (input.width - bar_.width) / 2;
  bar_.y = input.height - input.margin - bar_.height;
  cellsLeft_ = (input.width - cells) / 2;
  cellsTop_ = bar_.y + input.caption + input.gap;
  buttonsLeft_ = (input.width - buttons) / 2;
  buttonsTop_ = bar_.y + bar_.height - input.gap - input.button;
}

Rect OverlayLayout::Button(size_t button) const {
  const auto step = static_cast<int32_t>(button) * (input_.button + input_.gap);
  return {buttonsLeft_ + step, buttonsTop_, input_.button, input_.button};
}

Rect OverlayLayout::Cell(size_t file) const {
  const auto step = static_cast<int32_t>(file - cells_.first) * (input_.cell + input_.gap);
  return {cellsLeft_ + step, cellsTop_, input_.cell, input_.cell};
}

OverlayLayout::Hit OverlayLayout::At(int32_t x, int32_t y) const {
  if (!bar_.Contains(x, y)) return {};
  for (size_t button = 0; button < input_.buttons; ++button) {
    if (Button(button).Contains(x, y)) return {Part::Button, button};
  }
  for (size_t file = cells_.first; file < cells_.end; ++file) {
    if (Cell(file).Contains(x, y)) return {Part::Cell, file};
  }
  return {Part::Bar, 0};
}

void Fade::Turn(bool shown, double now, bool gradually) {
  if (shown == shown_) return;
  from_ = gradually ? Opacity(now) : (shown ? 1 : 0);
  since_ = now;
  shown_ = shown;
}

double Fade::Opacity(double now) const {
  const double way = std::max(now - since_, 0.0) / kSeconds;
  return shown_ ? std::min(from_ + way, 1.0) : std::max(from_ - way, 0.0);
}

}  // namespace fotomill::desktop
