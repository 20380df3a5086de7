#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpMatch(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
