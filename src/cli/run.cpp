#include <CLI/CLI.hpp>

#include "cli/command.h"
#include "cli/commands.h"

namespace fotomill::cli {

int RunCommandLine(int count, const char* const* arguments, const Io& io) {
  CommandContext context{io};
  CLI::App app("Fotomill Professional: manages, views, converts and processes pictures.", "fotomill");
  app.require_subcommand(1);
  for (const Command& command : Commands()) command.setUp(*app.add_subcommand(command.name, command.summary), context);
  try {
    app.parse(count, arguments);
  } catch (const CLI::ParseError& error) {
    return app.exit(error) == 0 ? kExitOk : kExitUsage;
  }
  return context.exitStatus;
}

}  // namespace fotomill::cli
