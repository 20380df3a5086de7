#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// `find`: lists the pictures that meet some criteria, from what was read before where files have
// not changed.
void SetUpFind(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
