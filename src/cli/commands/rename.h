#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpRename(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
