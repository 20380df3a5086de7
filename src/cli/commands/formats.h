#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "formats": declares its options in `app` and sets context.run, which lists the registry's
// rows.
void SetUpFormats(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
