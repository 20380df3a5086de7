#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "turn": declares its options in `app` and sets context.run, which turns the named files,
// in place if asked to.
void SetUpTurn(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
