#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

void SetUpThumbsMake(CLI::App& app, CommandContext& context);
void SetUpThumbsShow(CLI::App& app, CommandContext& context);
void SetUpThumbsDraw(CLI::App& app, CommandContext& context);
void SetUpThumbsList(CLI::App& app, CommandContext& context);
void SetUpThumbsClean(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
