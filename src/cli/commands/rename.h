#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "rename": declares its options in `app` and sets context.run, which renames files with
// sequence numbers, or undoes that.
void SetUpRename(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
