#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands that change EXIF in files.
void SetUpExifSet(CLI::App& app, CommandContext& context);
void SetUpExifUnset(CLI::App& app, CommandContext& context);
void SetUpExifCopy(CLI::App& app, CommandContext& context);
void SetUpExifShift(CLI::App& app, CommandContext& context);
void SetUpExifOwner(CLI::App& app, CommandContext& context);
void SetUpExifStrip(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
