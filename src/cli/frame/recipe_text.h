#pragma once

#include <memory>
#include <string>
#include <vector>

#include "cli/frame/command.h"
#include "operations/recipe.h"

namespace fotomill::cli {

// Options that specify operations.
struct RecipeOptions {
  const std::string& steps;   // --do
  const std::string& recipe;  // --recipe
  bool needed;                // one of them is required
};

// Reads the recipe from the options; null if there is none and none is needed. False, after
// printing a message, for a usage error.
bool ReadRecipeOptions(const RecipeOptions& options, const CommandContext& context,
                       std::shared_ptr<const Recipe>& recipe);

}  // namespace fotomill::cli
