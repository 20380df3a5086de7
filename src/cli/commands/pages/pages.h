#pragma once

#include "cli/frame/command.h"

namespace fotomill::cli {

// Commands "pages ...": each declares its options in `app` and sets context.run, which puts the
// selected pictures on pages.
void SetUpPagesContact(CLI::App& app, CommandContext& context);
void SetUpPagesCatalog(CLI::App& app, CommandContext& context);
void SetUpPagesPhoto(CLI::App& app, CommandContext& context);
void SetUpPagesPrint(CLI::App& app, CommandContext& context);
void SetUpPagesPoster(CLI::App& app, CommandContext& context);
void SetUpPagesCube(CLI::App& app, CommandContext& context);
void SetUpPagesDodecahedron(CLI::App& app, CommandContext& context);
// Lists papers and print sizes.
void SetUpPagesPapers(CLI::App& app, CommandContext& context);

}  // namespace fotomill::cli
