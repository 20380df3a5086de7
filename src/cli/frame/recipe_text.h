#pragma once

#include <memory>
#include <string>
#include <vector>

#include "cli/frame/command.h"
#include "operations/recipe.h"

namespace fotomill::cli {

// The options that name operations.
struct RecipeOptions {
  const std::string& steps;   // --do
  const std::string& recipe;  // --recipe
  bool needed;                // one of them must be given
};

// Reads the recipe of a command line; null where none is given and none is needed. False after a
// message: a usage error.
bool ReadRecipeOptions(const RecipeOptions& options, const CommandContext& context,
                       std::shared_ptr<const Recipe>& recipe);

}  // namespace fotomill::cli
