#include "desktop/models/edit/step_list.h"

#include <algorithm>
#include <utility>

#include "settings/key_texts.h"

namespace fotomill::desktop {

StepList::StepList(Step first) {
  now_.steps.push_back({std::move(first)});
  now_.current = 0;
}

StepList::State& StepList::Change() {
  undo_.push_back(now_);
  redo_.clear();
  changing_.clear();
  return now_;
}

void StepList::Select(size_t place) {
  changing_.clear();
  now_.current = place < now_.steps.size() ? place : kNone;
}

void StepList::Add(Step step) {
  State& state = Change();
  const size_t place = state.current == kNone ? state.steps.size() : state.current + 1;
  state.steps.insert(state.steps.begin() + static_cast<std::ptrdiff_t>(place),
                     EditStep{std::move(step)});
  state.current = place;
}

void StepList::Remove(size_t place) {
  State& state = Change();
  state.steps.erase(state.steps.begin() + static_cast<std::ptrdiff_t>(place));
  state.current = state.steps.empty() ? kNone : std::min(place, state.steps.size() - 1);
}

void StepList::Move(size_t from, size_t to) {
  if (from == to) return Select(from);
  State& state = Change();
  const auto first = state.steps.begin();
  const auto a = static_cast<std::ptrdiff_t>(from), b = static_cast<std::ptrdiff_t>(to);
  if (from < to) {
    std::rotate(first + a, first + a + 1, first + b + 1);
  } else {
    std::rotate(first + b, first + a, first + a + 1);
  }
  state.current = to;
}

void StepList::Switch(size_t place, bool on) {
  if (now_.steps[place].on != on) Change().steps[place].on = on;
}

void StepList::Replace(std::vector<Step> steps) {
  State& state = Change();
  state.steps.clear();
  for (Step& step : steps) state.steps.push_back({std::move(step)});
  state.current = state.steps.empty() ? kNone : 0;
}

RecordedText StepList::Set(std::string_view parameter, const std::string& text) {
  Step step = now_.steps[now_.current].step;
  const auto rows = step.arguments.Rows();
  if (text.empty()) {
    const Step defaults = DefaultStep(*step.operation, KeyTextInForce);
    for (size_t i = 0; i < rows.size(); ++i) {
      if (rows[i].name != parameter) continue;
      if (rows[i].preset == nullptr) return TrRecorded("must be given");
      step.arguments.At(i) = defaults.arguments.At(i);
    }
  } else {
    for (size_t i = 0; i < rows.size(); ++i) {
      if (rows[i].name == parameter) step.arguments.At(i) = {};
    }
    if (RecordedText wrong = SetArgument(step, parameter, text); !wrong.empty()) return wrong;
  }
  if (step.operation->check != nullptr) {
    if (ArgumentProblem problem = step.operation->check(step.arguments); !problem.message.empty())
      return problem.message;
  }
  const std::string change = std::to_string(now_.current) + " " + std::string(parameter);
  if (ArgumentText(step, parameter) == ArgumentText(*CurrentStep(), parameter)) return {};
  if (change != changing_) Change();
  changing_ = change;
  now_.steps[now_.current].step = std::move(step);
  return {};
}

void StepList::SetCurrent(Step step) {
  if (now_.current == kNone) return;
  State& state = Change();
  state.steps[state.current].step = std::move(step);
}

void StepList::Undo() {
  if (undo_.empty()) return;
  redo_.push_back(std::exchange(now_, std::move(undo_.back())));
  undo_.pop_back();
  changing_.clear();
}

void StepList::Redo() {
  if (redo_.empty()) return;
  undo_.push_back(std::exchange(now_, std::move(redo_.back())));
  redo_.pop_back();
  changing_.clear();
}

std::vector<Step> StepList::Applied() const {
  std::vector<Step> steps;
  for (const EditStep& step : now_.steps) {
    if (step.on) steps.push_back(step.step);
  }
  return steps;
}

std::string StepList::RecipeText() const {
  std::string text;
  for (const Step& step : Applied()) text.append(PrintStep(step)).append("\n");
  return text;
}

Step FirstStep(const Operation& operation) {
  Step step = DefaultStep(operation, KeyTextInForce);
  Recipe example;
  if (!ReadRecipe(operation.example, KeyTextInForce, example).empty()) return step;
  const Step& shown = example.common.front();
  const auto rows = step.arguments.Rows();
  for (size_t i = 0; i < rows.size(); ++i) {
    if (!step.arguments.At(i).given && rows[i].preset == nullptr)
      step.arguments.At(i) = shown.arguments.At(i);
  }
  const bool valid = operation.check == nullptr || operation.check(step.arguments).message.empty();
  return valid ? step : shown;
}

std::string ArgumentText(const Step& step, std::string_view parameter) {
  const Value& value = step.arguments.Of(parameter);
  return value.given ? value.text : std::string();
}

}  // namespace fotomill::desktop
