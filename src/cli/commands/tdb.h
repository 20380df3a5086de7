#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "tdb add", "find", "list", "delete" and "compact": declare names and options in `app`
// and set context.run.
void SetUpTdbAdd(CLI::App& app, CommandContext& context);
void SetUpTdbFind(CLI::App& app, CommandContext& context);  // writes one thumbnail as a picture
// The records, those marked as deleted too.
void SetUpTdbList(CLI::App& app, CommandContext& context);
void SetUpTdbDelete(CLI::App& app, CommandContext& context);  // marks; frees no space
void SetUpTdbCompact(CLI::App& app, CommandContext& context);  // drops what is marked

}  // namespace fotomill::cli
