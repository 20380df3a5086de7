#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "operations/recipe.h"
#include "texts/texts.h"

namespace fotomill::desktop {

// A step of an Edit window.
struct EditStep {
  Step step;
  bool on = true;  // false: kept in the list, but not applied
};

// The steps of an Edit window, with undo and redo of every change.
class StepList {
 public:
  static constexpr size_t kNone = SIZE_MAX;

  StepList() = default;
  explicit StepList(Step first);  // which is not a change

  const std::vector<EditStep>& Steps() const { return now_.steps; }
  size_t Current() const { return now_.current; }  // the step being edited, or kNone
  // Null if there is no current step.
  const Step* CurrentStep() const {
    return now_.current == kNone ? nullptr : &now_.steps[now_.current].step;
  }
  void Select(size_t place);  // not a change

  // Changes, each undone by one Undo. Places must be valid.
  void Add(Step step);  // after the current one; becomes the current one
  void Remove(size_t place);
  void Move(size_t from, size_t to);  // to its place in the new order; it becomes the current one
  void Switch(size_t place, bool on);
  void Replace(std::vector<Step> steps);  // all of them
  // Sets a parameter of the current step; an empty text resets it to its default. Consecutive
  // changes of a parameter are one change until EndChange. Returns what is wrong, as from
  // ReadValue; the step is then unchanged.
  RecordedText Set(std::string_view parameter, const std::string& text);
  void EndChange() { changing_.clear(); }
  // Replaces the current step by one of the same operation.
  void SetCurrent(Step step);

  bool CanUndo() const { return !undo_.empty(); }
  bool CanRedo() const { return !redo_.empty(); }  // until the next change
  void Undo();
  void Redo();

  // The steps that are switched on, and their recipe text.
  std::vector<Step> Applied() const;
  std::string RecipeText() const;

 private:
  struct State {
    std::vector<EditStep> steps;
    size_t current = kNone;
  };
  State& Change();

  State now_;
  std::vector<State> undo_, redo_;
  std::string changing_;  // step and parameter of the last change; empty: the next is a new one
};

// A step to start with: the defaults; required parameters are those of the operation's example.
Step FirstStep(const Operation& operation);
// The current text of a parameter, for a control; empty if it has none.
std::string ArgumentText(const Step& step, std::string_view parameter);

}  // namespace fotomill::desktop
