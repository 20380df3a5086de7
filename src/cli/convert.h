#pragma once

#include "cli/command.h"

namespace fotomill::cli {

void SetUpConvert(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
