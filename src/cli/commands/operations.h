#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// The table of operations, or one of them with its parameters.
void SetUpOperations(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
