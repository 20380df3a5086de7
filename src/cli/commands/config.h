#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpConfigList(CLI::App& app, CommandContext& context);
void SetUpConfigGet(CLI::App& app, CommandContext& context);
void SetUpConfigSet(CLI::App& app, CommandContext& context);
void SetUpConfigUnset(CLI::App& app, CommandContext& context);
void SetUpConfigPath(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
