#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpVerify(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
