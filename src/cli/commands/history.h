#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "history list", "add" and "clear": declare names and options in `app` and set
// context.run.
void SetUpHistoryList(CLI::App& app, CommandContext& context);
void SetUpHistoryAdd(CLI::App& app, CommandContext& context);    // records one use of a file
void SetUpHistoryClear(CLI::App& app, CommandContext& context);  // deletes the history file

}  // namespace fotomill::cli
