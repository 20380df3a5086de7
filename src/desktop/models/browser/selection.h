#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill::desktop {

// No line.
inline constexpr size_t kNoLine = static_cast<size_t>(-1);

// Selection, focus and range anchor in a list: implements the mouse and keyboard rules of all file
// lists. Lines are counted from 0.
class Selection {
 public:
  // A list of `count` lines, none selected.
  void Reset(size_t count);
  // Replaces the list: `selected` for each
  // line, focus and anchor (kNoLine: none).
  void Assign(std::vector<bool> selected, size_t focus, size_t anchor);

  // Number of lines and of selected lines;
  // focus and anchor may be kNoLine.
  size_t Count() const { return selected_.size(); }
  size_t SelectedCount() const { return selectedCount_; }  // at most Count
  // False beyond the last line.
  bool IsSelected(size_t line) const { return line < selected_.size() && selected_[line]; }
  size_t Focus() const { return focus_; }    // a line, or kNoLine
  size_t Anchor() const { return anchor_; }  // start of a range extended with Shift
  // Selected lines in list order.
  std::vector<size_t> SelectedLines() const;

  // Handles a click; Shift extends from the anchor, Ctrl keeps the selection.
  void Click(size_t line, bool shift, bool control);
  // Handles a right click: selects the line, unless it is selected.
  void ContextClick(size_t line);
  // Handles a click on empty space.
  void ClickBlank(bool clears) {
    if (clears) SelectNone();
  }
  // Moves the focus with the keyboard: selects only this line; with Shift the range from the
  // anchor; with Ctrl nothing.
  void MoveFocus(size_t line, bool shift, bool control);
  void ToggleFocus();            // toggles the focused line, keeping others
  void SelectOnly(size_t line);  // moves focus and anchor there
  // Keeps the focus.
  void SelectAll();
  void SelectNone();                     // keeps the focus
  void Invert();                         // inverts the selection
  void Set(size_t line, bool selected);  // keeps focus and anchor

  // Rubber band: selects the lines `inside` it; with `keep`, in addition to the selection at its
  // start.
  void BeginBand(bool keep);
  // Lines that the band has left get their previous state back.
  void MoveBand(std::span<const size_t> inside);

 private:
  void SelectRange(size_t from, size_t to, bool keep);

  std::vector<bool> selected_;
  std::vector<bool> beforeBand_;
  size_t selectedCount_ = 0;
  size_t focus_ = kNoLine;
  size_t anchor_ = kNoLine;
};

}  // namespace fotomill::desktop
