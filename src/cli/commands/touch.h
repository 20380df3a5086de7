#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// `touch`: sets the times of files.
void SetUpTouch(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
