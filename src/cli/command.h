#pragma once

#include "cli/io.h"

namespace CLI {
class App;
}

namespace fotomill::cli {

// Exit statuses that scripts rely on.
inline constexpr int kExitOk = 0;
inline constexpr int kExitFailed = 1;  // a file failed, or a lookup found nothing
inline constexpr int kExitUsage = 2;   // nothing was touched

// What a command's callback works with: where it prints, and where it leaves its exit status.
struct CommandContext {
  Io io;
  int exitStatus = kExitOk;
};

// One command: a line of the table in commands.cpp, which help, dispatch and nearest-name hints read.
struct Command {
  const char* name;
  const char* summary;
  // Declares options and help on the command's parser and sets its callback. `context` outlives the parser.
  void (*setUp)(CLI::App& app, CommandContext& context);
};

// Parses and runs one command line; the exit status of the program. Never throws.
int RunCommandLine(int count, const char* const* arguments, const Io& io);

}  // namespace fotomill::cli
