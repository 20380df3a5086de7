#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "config list", "get", "describe", "set", "unset" and "path": declare names and options
// in `app` and set context.run.
void SetUpConfigList(CLI::App& app, CommandContext& context);
void SetUpConfigGet(CLI::App& app, CommandContext& context);
void SetUpConfigDescribe(CLI::App& app, CommandContext& context);
void SetUpConfigSet(CLI::App& app, CommandContext& context);
void SetUpConfigUnset(CLI::App& app, CommandContext& context);
void SetUpConfigPath(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
