#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "plugins": declares its options in `app` and sets context.run, which lists the plug-in
// formats.
void SetUpPlugins(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
