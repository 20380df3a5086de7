#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "gallery": declares its options in `app` and sets context.run, which builds a folder of
// web pages with the selected pictures.
void SetUpGallery(CLI::App& app, CommandContext& context);
// Command "gallery theme": writes the built-in theme's files, as a start for one's own.
void SetUpGalleryTheme(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
