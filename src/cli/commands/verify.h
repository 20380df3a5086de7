#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "verify": declares its options in `app` and sets context.run, which fully decodes files,
// including all pages.
void SetUpVerify(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
