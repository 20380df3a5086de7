#pragma once

#include "cli/frame/command.h"
#include "cli/selection/rewrite_options.h"
#include "metadata/edit/picture_edit.h"

namespace fotomill::cli {

// Commands that change EXIF in files.
void SetUpExifSet(CLI::App& app, CommandContext& context);
void SetUpExifUnset(CLI::App& app, CommandContext& context);
void SetUpExifCopy(CLI::App& app, CommandContext& context);
void SetUpExifShift(CLI::App& app, CommandContext& context);
void SetUpExifOwner(CLI::App& app, CommandContext& context);
void SetUpExifStrip(CLI::App& app, CommandContext& context);

// Makes the same kind of change to every file of the command line; the exit status.
int RunExifEdit(RewriteOptions& options, const ExifChanger& changer, const CommandContext& context);

}  // namespace fotomill::cli
