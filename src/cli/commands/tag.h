#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "tag": sets keywords, ratings, labels and comments of pictures.
void SetUpTag(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
