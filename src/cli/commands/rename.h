#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "rename": declares its options in `app` and sets context.run, which numbers the named
// files, or takes it back.
void SetUpRename(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
