#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Command "doctor": sets context.run, which shows paths and libraries, and what is disabled or
// missing. Changes nothing.
void SetUpDoctor(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
