#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "info": declares its options in `app` and sets context.run, which describes files without
// decoding them.
void SetUpInfo(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
