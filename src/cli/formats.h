#pragma once

#include "cli/command.h"

namespace fotomill::cli {

void SetUpFormats(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
