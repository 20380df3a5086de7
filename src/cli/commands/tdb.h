#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "tdb add", "find", "list", "delete" and "compact": declare names and options in `app`
// and set context.run.
void SetUpTdbAdd(CLI::App& app, CommandContext& context);
void SetUpTdbFind(CLI::App& app, CommandContext& context);  // writes one thumbnail as a picture
// Includes records marked as deleted.
void SetUpTdbList(CLI::App& app, CommandContext& context);
void SetUpTdbDelete(CLI::App& app, CommandContext& context);  // marks records; frees no space
void SetUpTdbCompact(CLI::App& app, CommandContext& context);  // removes marked records

}  // namespace fotomill::cli
