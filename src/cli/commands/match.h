#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "match": sets context.run, which tells the format that a name selects. The file need not
// be there.
void SetUpMatch(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
