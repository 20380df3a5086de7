#pragma once

#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "operations/operation.h"

// Recipes are texts, one operation a line:
//
//   # a comment: the first character of a line is "#"
//   upright                                  an operation
//   crop 3:2 gravity=center; sharpen 0.6     ";" outside quotes ends a line too
//   output large                             what comes before the first output is common to all
//   and done once
//     resize 2048x2048
//     save to=jpg quality=85 name="%F-large"
//
// A line is words separated by blanks. Quotes are those of a shell: '...' as it is, "..." with \"
// and \\ in it, and a backslash elsewhere quotes the next character. Words without a name are the
// operation's parameters in order, the others are name=value; a flag is given by its name alone.
namespace fotomill {

// One operation with its arguments.
struct Step {
  const Operation* operation = nullptr;
  Arguments arguments;
};

// The destination step of an output: the parameters of `save`.
struct SaveStep {
  std::string to;      // extension; empty: as asked for elsewhere
  std::string folder;  // relative to the run's
  std::string name;    // with macros, without extension; empty: the usual one
  int32_t quality = 0;       // 1 to 100; 0: as configured
  uint64_t mostBytes = 0;    // 0: no limit
  bool operator==(const SaveStep&) const = default;
};

// One output of a recipe, and the steps that lead to it.
struct RecipeOutput {
  std::string name;  // empty for the only output of a recipe without any
  std::vector<Step> steps;
  SaveStep save;
  bool hasSave = false;
};

// What a recipe file says.
struct Recipe {
  std::vector<Step> common;
  std::vector<RecipeOutput> outputs;  // at least one

  // The first operation that is applied; null when the recipe only saves.
  const Operation* First() const;
  bool HasSteps() const { return First() != nullptr; }  // an output has at least one
  // It has steps, and all of them only move or cut off pixels.
  bool OnlyMovesPixels() const;
};

// What is wrong in a recipe, and where.
struct Mistake {
  int32_t line = 0;       // from 1
  std::string operation;  // as written; empty where it is not about one
  std::string parameter;  // likewise
  RecordedText message;   // a sentence that is complete with those: "must be 0 to 100."

  // For people: "Line 2: resize: filter must be ..."; without the line for recipes of one line.
  std::string Text(bool withLine = true) const;
};

// The value of a configuration key as its file holds it; empty for a key that does not exist. Fills
// defaults.
using KeyValues = std::function<std::string(std::string_view key)>;

// Reads a recipe. Without mistakes, `recipe` has it; else it is left alone.
std::vector<Mistake> ReadRecipe(std::string_view text, const KeyValues& keys, Recipe& recipe);

// A recipe as text; reading it gives the same recipe. Parameters with their default values are left
// out.
std::string PrintRecipe(const Recipe& recipe);
std::string PrintStep(const Step& step);  // one step as the recipe has it

// A step with every parameter at its default. Required parameters have none yet: nothing may run
// before they are set.
Step DefaultStep(const Operation& operation, const KeyValues& keys);
// Gives a parameter of a step a value, for dialogs. Empty when done, else what is wrong, as
// ReadValue says.
RecordedText SetArgument(Step& step, std::string_view parameter, std::string_view text);
// The text of a parameter's default: that of its key, else its preset; nullopt when there is none.
std::optional<std::string> DefaultText(const Parameter& row, const KeyValues& keys);

// The parameters of `save`, for help and completion.
std::span<const Parameter> SaveParameters();

// A number of bytes: 40000, 40k or 2M, with a k of 1024. nullopt for anything else and for 0.
std::optional<uint64_t> ReadByteCount(std::string_view text);

}  // namespace fotomill
