#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "config list", "get", "describe", "set", "unset" and "path": declare names and options
// in `app` and set context.run.
void SetUpConfigList(CLI::App& app, CommandContext& context);
// Prints the values of the given keys.
void SetUpConfigGet(CLI::App& app, CommandContext& context);
// Describes keys and their allowed values.
void SetUpConfigDescribe(CLI::App& app, CommandContext& context);
// Sets one key after validating its value.
void SetUpConfigSet(CLI::App& app, CommandContext& context);
void SetUpConfigUnset(CLI::App& app, CommandContext& context);  // back to the default
void SetUpConfigPath(CLI::App& app, CommandContext& context);   // path, even if the file is missing

}  // namespace fotomill::cli
