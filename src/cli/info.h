#pragma once

#include "cli/command.h"

namespace fotomill::cli {

void SetUpInfo(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
