#include "desktop/models/edit/operation_memory.h"

#include <algorithm>

#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/limits.h"
#include "desktop/models/edit/step_list.h"
#include "operations/operations.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/key_texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kFile = "FMWOperations.txt";
constexpr const char* kChosen = "chosen";
constexpr const char* kLast = "last";
constexpr const char* kPreset = "preset";

std::string_view TakeField(std::string_view& line, char end) {
  const size_t place = line.find(end);
  const std::string_view field = line.substr(0, place);
  line.remove_prefix(place == std::string_view::npos ? line.size() : place + 1);
  return field;
}

// The single step of a line; false if it is no longer valid.
bool ReadStep(const std::string& text, Step& step) {
  Recipe recipe;
  if (!ReadRecipe(text, KeyTextInForce, recipe).empty() || recipe.common.size() != 1) return false;
  step = std::move(recipe.common.front());
  return true;
}

// The name of the operation of a step's text.
std::string_view OperationOf(std::string_view step) { return step.substr(0, step.find(' ')); }

const Operation& FirstOf(Family family) {
  return **std::ranges::find(Operations(), family, &Operation::family);
}

}  // namespace

std::vector<OperationMemory::Line> OperationMemory::Parse(std::string_view text) {
  std::vector<Line> lines;
  while (!text.empty()) {
    std::string_view line = TakeField(text, '\n');
    if (line.ends_with('\r')) line.remove_suffix(1);
    if (line.empty()) continue;
    Line read;
    read.kind = TakeField(line, '\t');
    if (read.kind == kPreset) read.name = TakeField(line, '\t');
    read.rest = line;
    lines.push_back(std::move(read));
  }
  return lines;
}

OperationMemory::OperationMemory() {
  std::string text;
  const std::string path = DataFile(kFile);
  if (!path.empty()) (void)platform::ReadWholeFile(path, limits.listFileBytes, text);
  lines_ = Parse(text);
}

template <typename Edit>
bool OperationMemory::Change(const Edit& edit) {
  edit(lines_);
  const EditResult result =
      EditTextFile(DataFile(kFile), limits.listFileBytes, [&](std::string& text) {
        lines_ = Parse(text);  // another process may have changed it
        edit(lines_);
        text.clear();
        for (const Line& line : lines_) {
          text.append(line.kind).append("\t");
          if (line.kind == kPreset) text.append(line.name).append("\t");
          text.append(line.rest).append(platform::kLineEnd);
        }
      });
  return result == EditResult::Done || result == EditResult::Unchanged;
}

const Operation& OperationMemory::Chosen(Family family) const {
  for (const Line& line : lines_) {
    const Operation* const operation = line.kind == kChosen ? FindOperation(line.rest) : nullptr;
    if (operation != nullptr && operation->family == family) return *operation;
  }
  return FirstOf(family);
}

Step OperationMemory::Start(const Operation& operation) const {
  Step step;
  for (const Line& line : lines_) {
    if (line.kind == kLast && OperationOf(line.rest) == operation.name && ReadStep(line.rest, step))
      return step;
  }
  return FirstStep(operation);
}

std::vector<Preset> OperationMemory::PresetsOf(const Operation& operation) const {
  std::vector<Preset> presets;
  for (const Line& line : lines_) {
    Preset preset{line.name, {}};
    if (line.kind == kPreset && OperationOf(line.rest) == operation.name &&
        ReadStep(line.rest, preset.step))
      presets.push_back(std::move(preset));
  }
  std::ranges::sort(presets, {}, &Preset::name);
  return presets;
}

bool OperationMemory::KeepChosen(const Operation& operation) {
  if (&Chosen(operation.family) == &operation) return true;
  return Change([&](std::vector<Line>& lines) {
    std::erase_if(lines, [&](const Line& line) {
      const Operation* const other = line.kind == kChosen ? FindOperation(line.rest) : nullptr;
      return other != nullptr && other->family == operation.family;
    });
    lines.push_back({kChosen, {}, operation.name});
  });
}

bool OperationMemory::KeepLast(const std::vector<Step>& steps) {
  return Change([&](std::vector<Line>& lines) {
    for (const Step& step : steps) {
      std::erase_if(lines, [&](const Line& line) {
        return line.kind == kLast && OperationOf(line.rest) == step.operation->name;
      });
      lines.push_back({kLast, {}, PrintStep(step)});
    }
  });
}

bool OperationMemory::KeepPreset(std::string name, const Step& step) {
  std::ranges::replace_if(
      name, [](char c) { return static_cast<unsigned char>(c) < ' '; }, ' ');
  const std::string_view operation = step.operation->name;
  return Change([&](std::vector<Line>& lines) {
    std::erase_if(lines, [&](const Line& line) {
      return line.kind == kPreset && line.name == name && OperationOf(line.rest) == operation;
    });
    lines.push_back({kPreset, name, PrintStep(step)});
  });
}

bool OperationMemory::RemovePreset(const std::string& name, const Operation& operation) {
  return Change([&](std::vector<Line>& lines) {
    std::erase_if(lines, [&](const Line& line) {
      return line.kind == kPreset && line.name == name && OperationOf(line.rest) == operation.name;
    });
  });
}

}  // namespace fotomill::desktop
