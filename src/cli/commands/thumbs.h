#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "thumbs make", "show", "draw", "list" and "clean": declare names and options in `app`
// and set context.run.
void SetUpThumbsMake(CLI::App& app, CommandContext& context);
// Writes a stored thumbnail as a picture.
void SetUpThumbsShow(CLI::App& app, CommandContext& context);
// Creates a thumbnail; stores nothing.
void SetUpThumbsDraw(CLI::App& app, CommandContext& context);
void SetUpThumbsList(CLI::App& app, CommandContext& context);   // which thumbnails are current
void SetUpThumbsClean(CLI::App& app, CommandContext& context);  // deletes orphaned thumbnails

}  // namespace fotomill::cli
