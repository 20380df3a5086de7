#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpConvert(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
