#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill::desktop {

// Stands for no line.
inline constexpr size_t kNoLine = static_cast<size_t>(-1);

// What is selected among the lines of a list, which line has the focus, and from where a range
// extends: the rules that mouse and keyboard follow in every file list. Lines are counted from 0.
class Selection {
 public:
  // A list of `count` lines with nothing selected.
  void Reset(size_t count);
  // The list anew: `selected` for each line, and where focus and anchor are now, kNoLine for
  // nowhere.
  void Assign(std::vector<bool> selected, size_t focus, size_t anchor);

  // How many lines there are and how many are selected; focus and anchor are kNoLine when they are
  // nowhere.
  size_t Count() const { return selected_.size(); }
  size_t SelectedCount() const { return selectedCount_; }  // at most Count
  // False beyond the last line.
  bool IsSelected(size_t line) const { return line < selected_.size() && selected_[line]; }
  size_t Focus() const { return focus_; }    // a line, or kNoLine
  size_t Anchor() const { return anchor_; }  // where a range begins that Shift extends
  // Selected lines in list order.
  std::vector<size_t> SelectedLines() const;

  // A click, with Shift to extend from the anchor and Ctrl to keep what is selected.
  void Click(size_t line, bool shift, bool control);
  // A right click: selects the line unless it is selected already.
  void ContextClick(size_t line);
  // A click into empty space.
  void ClickBlank(bool clears) {
    if (clears) SelectNone();
  }
  // The focus goes to a line by keyboard: alone it selects the line, with Shift the range from the
  // anchor, with Ctrl it moves without selecting.
  void MoveFocus(size_t line, bool shift, bool control);
  void ToggleFocus();  // selects the focused line, or not any more; others stay
  void SelectOnly(size_t line);  // focus and anchor go there
  // The focus stays.
  void SelectAll();
  void SelectNone();  // the focus stays
  void Invert();  // selects what was not, and nothing else
  void Set(size_t line, bool selected);  // focus and anchor stay

  // The rubber band: `inside` are the lines that it touches now; with `keep` they add to what was
  // selected when it began.
  void BeginBand(bool keep);
  // Lines that the band has left get back what they were.
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
