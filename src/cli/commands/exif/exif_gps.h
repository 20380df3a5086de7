#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "exif gps": sets the position of pictures.
void SetUpExifGps(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
