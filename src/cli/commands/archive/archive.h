#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "archive ...": ZIP and RAR archives; `create` writes ZIP.
void SetUpArchiveList(CLI::App& app, CommandContext& context);
void SetUpArchiveTest(CLI::App& app, CommandContext& context);
void SetUpArchiveExtract(CLI::App& app, CommandContext& context);
void SetUpArchiveCreate(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
