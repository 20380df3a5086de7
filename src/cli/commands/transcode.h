#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "transcode": declares its options in `app` and sets context.run, which stores JPEG files
// in JPEG XL and restores them, without decoding.
void SetUpTranscode(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
