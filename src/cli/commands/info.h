#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpInfo(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
