#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// A word of a recipe, unquoted.
struct RecipeWord {
  std::string text;
  size_t equals = std::string::npos;  // position of the first unquoted "="
  bool quoted = false;                // part of it was quoted
};

// The words of one operation.
struct RecipeLine {
  int32_t number = 0;  // from 1: where it starts
  std::vector<RecipeWord> words;
  bool open = false;  // has an unterminated quote
};

// Splits a recipe into lines of words, without comments and empty lines.
std::vector<RecipeLine> SplitRecipe(std::string_view text);

// Quotes a word for a recipe if needed.
std::string QuotedWord(std::string_view text);

}  // namespace fotomill
