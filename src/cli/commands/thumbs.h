#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "thumbs make", "show", "draw", "list" and "clean": declare names and options in `app`
// and set context.run.
void SetUpThumbsMake(CLI::App& app, CommandContext& context);
void SetUpThumbsShow(CLI::App& app, CommandContext& context);
void SetUpThumbsDraw(CLI::App& app, CommandContext& context);
void SetUpThumbsList(CLI::App& app, CommandContext& context);
void SetUpThumbsClean(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
