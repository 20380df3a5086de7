#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "operations/recipe.h"

namespace fotomill {
namespace {

void Require(bool holds) {
  if (!holds) std::abort();
}

// The configuration, taken from the second half of the input, so that keys contain
// anything as well.
KeyValues KeysFrom(std::string_view text) {
  const std::string value(text.substr(text.size() - text.size() / 2));
  return [value](std::string_view) { return value; };
}

// A recipe must be parsed or its errors reported, each on one line; the printed form of a parsed
// one must parse and print the same.
void TryRecipe(std::string_view text, const KeyValues& keys) {
  Recipe recipe;
  const std::vector<Mistake> mistakes = ReadRecipe(text, keys, recipe);
  for (const Mistake& mistake : mistakes) {
    Require(!mistake.message.empty() && mistake.line >= 1);
    Require(!mistake.Text().empty() && !mistake.Text(false).empty());
  }
  if (!mistakes.empty()) return;
  Require(!recipe.outputs.empty());
  const std::string printed = PrintRecipe(recipe);
  Recipe again;
  Require(ReadRecipe(printed, keys, again).empty());
  Require(PrintRecipe(again) == printed);
}

}  // namespace
}  // namespace fotomill

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace fotomill;
  const std::string text(data, data + size);
  TryRecipe(text, {});
  TryRecipe(text, KeysFrom(text));
  (void)ReadByteCount(text);
  return 0;
}
