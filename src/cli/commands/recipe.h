#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// The commands about recipes.
void SetUpRecipeList(CLI::App& app, CommandContext& context);
void SetUpRecipeShow(CLI::App& app, CommandContext& context);   // prints one as it is stored
void SetUpRecipeCheck(CLI::App& app, CommandContext& context);  // names mistakes; applies nothing

}  // namespace fotomill::cli
