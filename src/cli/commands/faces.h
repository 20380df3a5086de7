#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "faces": sets context.run, which prints where faces are in pictures.
void SetUpFaces(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
