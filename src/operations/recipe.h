#pragma once

#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "operations/operation.h"

// Recipes are texts with one operation per line:
//
//   # a comment: the first character of the line is "#"
//   upright                                  an operation
//   crop 3:2 gravity=center; sharpen 0.6     ";" outside quotes also ends a line
//   output large                             starts an output; steps before the first output are
//                                            common to all and run once
//     resize 2048x2048
//     save to=jpg quality=85 name="%F-large"
//
// A line consists of words separated by blanks, quoted as in a shell: '...' is literal, "..."
// allows \" and \\, and elsewhere a backslash quotes the next character. Words without a name are
// the operation's parameters in order, the others are name=value; the name alone sets a flag.
namespace fotomill {

// An operation with its arguments.
struct Step {
  const Operation* operation = nullptr;
  Arguments arguments;
};

// The final step of an output: the parameters of `save`.
struct SaveStep {
  std::string to;      // extension; empty: set elsewhere
  std::string folder;  // relative to the run's destination folder
  std::string name;    // with macros, without extension; empty: default
  int32_t quality = 0;       // 1 to 100; 0: use settings
  uint64_t mostBytes = 0;    // 0: no limit
  bool operator==(const SaveStep&) const = default;
};

// One output of a recipe, with its steps.
struct RecipeOutput {
  std::string name;  // empty if the recipe has no "output" lines
  std::vector<Step> steps;
  SaveStep save;
  bool hasSave = false;
};

// A parsed recipe.
struct Recipe {
  std::vector<Step> common;
  std::vector<RecipeOutput> outputs;  // at least one

  // The first operation to apply; null if the recipe only saves.
  const Operation* First() const;
  bool HasSteps() const { return First() != nullptr; }  // common or of an output
  // It has steps, and all of them only move or crop pixels.
  bool OnlyMovesPixels() const;
};

// An error in a recipe, and its position.
struct Mistake {
  int32_t line = 0;       // from 1
  std::string operation;  // as written; empty if not about an operation
  std::string parameter;  // likewise
  RecordedText message;   // completes a sentence with those: "must be 0 to 100."

  // For display: "Line 2: resize: filter must be ..."; one-line recipes omit the line.
  std::string Text(bool withLine = true) const;
};

// Returns the value of a configuration key as in its file; empty for an unknown key. Used for
// defaults.
using KeyValues = std::function<std::string(std::string_view key)>;

// Parses a recipe. Sets `recipe` only if there are no mistakes.
std::vector<Mistake> ReadRecipe(std::string_view text, const KeyValues& keys, Recipe& recipe);

// Formats a recipe; parsing the result gives
// the same recipe. Default values are omitted.
std::string PrintRecipe(const Recipe& recipe);
std::string PrintStep(const Step& step);  // formats one step

// A step with all parameters at their defaults. Required parameters are unset; set them before
// running the step.
Step DefaultStep(const Operation& operation, const KeyValues& keys);
// Sets a parameter of a step, for dialogs. Empty on
// success, else what is wrong, as from ReadValue.
RecordedText SetArgument(Step& step, std::string_view parameter, std::string_view text);
// The default of a parameter in recipe syntax: from its key, else its preset; nullopt if there is
// none.
std::optional<std::string> DefaultText(const Parameter& row, const KeyValues& keys);

// The parameters of `save`, for help and completion.
std::span<const Parameter> SaveParameters();

// Parses a byte count: 40000, 40k or 2M, with 1k = 1024. nullopt if invalid or 0.
std::optional<uint64_t> ReadByteCount(std::string_view text);

}  // namespace fotomill
