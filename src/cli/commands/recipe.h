#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands for recipes.
void SetUpRecipeList(CLI::App& app, CommandContext& context);
void SetUpRecipeShow(CLI::App& app, CommandContext& context);   // prints a recipe as stored
void SetUpRecipeCheck(CLI::App& app, CommandContext& context);  // reports mistakes; applies nothing

}  // namespace fotomill::cli
