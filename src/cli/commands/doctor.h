#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "doctor": sets context.run, which tells where things are, what is missing and why. It
// changes nothing.
void SetUpDoctor(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
