#pragma once

#include "cli/command.h"

namespace fotomill::cli {

void SetUpExif(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
