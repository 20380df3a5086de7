#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpDoctor(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
