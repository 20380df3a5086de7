#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "exif gps": sets where pictures were taken.
void SetUpExifGps(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
