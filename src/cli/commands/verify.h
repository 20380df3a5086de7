#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "verify": declares its options in `app` and sets context.run, which decodes files in
// full, every page of them.
void SetUpVerify(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
