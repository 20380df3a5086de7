#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "faces": sets context.run, which prints the positions of faces in pictures.
void SetUpFaces(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
