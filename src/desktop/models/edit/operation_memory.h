#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "operations/recipe.h"

namespace fotomill::desktop {

// A set of values for an operation, named by the user.
struct Preset {
  std::string name;
  Step step;
};

// What the program remembers about operations, in the file "FMWOperations.txt" of the data folder.
// Each line is one of
//
//   chosen<TAB>OPERATION        the operation of its family that was chosen last
//   last<TAB>STEP               the values that were applied last, as in a recipe
//   preset<TAB>NAME<TAB>STEP    a set of values
//
// Lines that the program does not understand are kept.
class OperationMemory {
 public:
  OperationMemory();  // reads the file

  // The operation of a family to start with: the last one chosen, or the family's first.
  const Operation& Chosen(Family family) const;
  // The step to start with: the values applied last, or those of FirstStep.
  Step Start(const Operation& operation) const;
  std::vector<Preset> PresetsOf(const Operation& operation) const;  // sorted by name

  // Changes, written to the file. False if that failed; the change then lasts until the program
  // ends.
  bool KeepChosen(const Operation& operation);
  bool KeepLast(const std::vector<Step>& steps);  // the applied steps
  // Replaces one of the same name. Tabs and line ends in the name become blanks.
  bool KeepPreset(std::string name, const Step& step);
  bool RemovePreset(const std::string& name, const Operation& operation);

 private:
  struct Line {
    std::string kind, name;
    std::string rest;  // a step or an operation
  };
  static std::vector<Line> Parse(std::string_view text);
  template <typename Edit>
  bool Change(const Edit& edit);

  std::vector<Line> lines_;
};

}  // namespace fotomill::desktop
