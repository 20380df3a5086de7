#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "history list", "add" and "clear": declare names and options in `app` and set
// context.run.
void SetUpHistoryList(CLI::App& app, CommandContext& context);
void SetUpHistoryAdd(CLI::App& app, CommandContext& context);    // records the use of one file
void SetUpHistoryClear(CLI::App& app, CommandContext& context);  // deletes the file of the history

}  // namespace fotomill::cli
