#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "match": sets context.run, which prints the format selected by a file name. The file need
// not exist.
void SetUpMatch(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
