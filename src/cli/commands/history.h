#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpHistoryList(CLI::App& app, CommandContext& context);
void SetUpHistoryAdd(CLI::App& app, CommandContext& context);
void SetUpHistoryClear(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
