#pragma once

#include "cli/command.h"

namespace fotomill::cli {

void SetUpRename(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
