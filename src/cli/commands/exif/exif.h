#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "exif": declares its options in `app` and sets context.run, which lists EXIF entries or
// extracts the thumbnail.
void SetUpExif(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
