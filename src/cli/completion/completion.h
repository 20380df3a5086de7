#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "completion": sets context.run, which prints the script for bash, zsh, fish or
// PowerShell.
void SetUpCompletion(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
