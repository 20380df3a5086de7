#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// One word of a recipe, its quotes resolved.
struct RecipeWord {
  std::string text;
  size_t equals = std::string::npos;  // place of the first "=" that is not quoted
  bool quoted = false;                // any of it was
};

// The words of one operation.
struct RecipeLine {
  int32_t number = 0;  // from 1: where it begins
  std::vector<RecipeWord> words;
  bool open = false;  // its last quote does not end
};

// Cuts a recipe into lines of words; comments and empty lines are left out.
std::vector<RecipeLine> SplitRecipe(std::string_view text);

// A word as a recipe holds it: quoted where it has to be.
std::string QuotedWord(std::string_view text);

}  // namespace fotomill
