#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "operations": lists all operations, or describes one with its parameters.
void SetUpOperations(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
