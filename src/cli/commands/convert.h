#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "convert": declares its options in `app` and sets context.run, which converts the named
// files as one batch.
void SetUpConvert(CLI::App& app, CommandContext& context);
// Command "apply": the same with operations, which are required; the format is optional.
void SetUpApply(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
