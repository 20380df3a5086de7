#pragma once

#include <cstddef>
#include <cstdint>

#include "desktop/models/browser/cell_layout.h"

namespace fotomill::desktop {

// The layout of the bar over the picture in a view window: a row of buttons at the bottom, above it
// a film strip with the current file in the middle, and a caption at the top. In pixels of the
// window.
class OverlayLayout {
 public:
  // What decides the layout.
  struct Input {
    int32_t width = 0, height = 0;  // of the window
    size_t buttons = 0;
    bool strip = true;  // whether there is a film strip, if the window is high enough
    size_t files = 0, current = 0;
    int32_t button = 36, cell = 64, caption = 20;  // heights; buttons and cells are squares
    int32_t gap = 4, margin = 12;                  // inside the bar, and around it
  };
  explicit OverlayLayout(const Input& input);
  OverlayLayout() = default;  // nothing

  const Rect& Bar() const { return bar_; }  // all of it; empty if the window is too small
  Rect Caption() const { return {bar_.x, bar_.y, bar_.width, input_.caption}; }
  Rect Button(size_t button) const;
  // The files in the film strip, and where they are.
  CellLayout::Range Cells() const { return cells_; }
  Rect Cell(size_t file) const;

  // What is at a point; `index` is that of a button or file.
  enum class Part { Outside, Bar, Button, Cell };
  struct Hit {
    Part part = Part::Outside;
    size_t index = 0;
    bool operator==(const Hit&) const = default;
  };
  Hit At(int32_t x, int32_t y) const;

 private:
  Input input_;
  Rect bar_;
  CellLayout::Range cells_;
  int32_t buttonsLeft_ = 0, buttonsTop_ = 0, cellsLeft_ = 0, cellsTop_ = 0;
};

// An opacity that changes gradually between 0 and 1.
class Fade {
 public:
  static constexpr double kSeconds = 0.2;  // from end to end

  // Begins to show or hide at a time in seconds; at once without `gradually`.
  void Turn(bool shown, double now, bool gradually = true);
  double Opacity(double now) const;
  bool Shown() const { return shown_; }  // or going to be
  bool Changing(double now) const { return Opacity(now) != (shown_ ? 1.0 : 0.0); }

 private:
  bool shown_ = false;
  double from_ = 0, since_ = -kSeconds;
};

}  // namespace fotomill::desktop
