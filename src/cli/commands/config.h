#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "config list", "get", "describe", "set", "unset" and "path": declare names and options
// in `app` and set context.run.
void SetUpConfigList(CLI::App& app, CommandContext& context);
// The values of the keys that are named.
void SetUpConfigGet(CLI::App& app, CommandContext& context);
// What keys do, and which values they take.
void SetUpConfigDescribe(CLI::App& app, CommandContext& context);
// Writes one key, after checking its value.
void SetUpConfigSet(CLI::App& app, CommandContext& context);
void SetUpConfigUnset(CLI::App& app, CommandContext& context);  // back to the default
void SetUpConfigPath(CLI::App& app, CommandContext& context);   // where the file is, or would be

}  // namespace fotomill::cli
