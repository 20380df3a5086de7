#pragma once

#include "cli/frame/command.h"
#include "cli/selection/rewrite_options.h"
#include "metadata/edit/picture_edit.h"

namespace fotomill::cli {

// Commands that edit EXIF.
void SetUpExifSet(CLI::App& app, CommandContext& context);
void SetUpExifUnset(CLI::App& app, CommandContext& context);
void SetUpExifCopy(CLI::App& app, CommandContext& context);
void SetUpExifShift(CLI::App& app, CommandContext& context);
void SetUpExifOwner(CLI::App& app, CommandContext& context);
void SetUpExifStrip(CLI::App& app, CommandContext& context);

// Applies `changer` to every file of the command line; returns the exit status.
int RunExifEdit(RewriteOptions& options, const ExifChanger& changer, const CommandContext& context);

}  // namespace fotomill::cli
