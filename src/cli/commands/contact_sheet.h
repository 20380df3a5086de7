#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "contact-sheet": declares its options in `app` and sets context.run, which draws the
// named pictures on pages.
void SetUpContactSheet(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
