#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "cli/frame/io.h"

namespace CLI {
class App;
}

namespace fotomill::cli {

// Exit statuses that scripts rely on.
inline constexpr int kExitOk = 0;
inline constexpr int kExitFailed = 1;  // a file failed, or a lookup found nothing
inline constexpr int kExitUsage = 2;   // nothing was touched

// The arguments of a command line that are not options: names of files, keys and the like.
struct NameArguments {
  // as the usage line shows them: "FILE...", "DB FILE..."; empty: the command takes none
  const char* placeholder = "";
  const char* help = "";  // in English
  size_t least = 0;
  size_t most = 0;
  std::vector<std::string> values;  // any bytes, in order

  // Says what a command takes: `shownAs` and `helpText` go into the help, fewer or more names than
  // the bounds are a usage error.
  void Declare(const char* shownAs, const char* helpText, size_t fewest,
               size_t greatest = SIZE_MAX) {
    placeholder = shownAs;
    help = helpText;
    least = fewest;
    most = greatest;
  }
};

// The options that every command takes.
struct GlobalOptions {
  std::string dataFolder;             // empty: the default one
  std::vector<std::string> settings;  // KEY=VALUE, in order
  bool quiet = false;
  bool verbose = false;  // more notes, and how long it took
  bool noInput = false;
  bool noPlugins = false;
  bool noHistory = false;
  std::string progress = "auto";  // auto, never
  std::string color = "auto";     // auto, always, never
  std::string language;           // as in StartTexts; it counts before anything is parsed
};

struct Command;

// What a command works with. `setUp` declares names and options and sets `run`; the frame parses,
// prepares and runs.
struct CommandContext {
  Io io;
  GlobalOptions global;
  const Command* command = nullptr;
  NameArguments names;
  std::function<int()> run;  // after parsing; returns the exit status

  // Whether the user can be asked.
  bool MayAsk() const { return io.Interactive() && !global.noInput; }
  // Whether to draw a progress bar.
  bool ProgressOn() const { return io.errTerminal && !global.quiet && global.progress != "never"; }
  // Whether messages, or results, are colored.
  bool ColorOn(bool terminal) const;
};

// What a command needs before it runs.
enum class Needs : uint8_t {
  Nothing,
  Settings,  // the configuration, with --set on top
  Formats,   // the same, and the format registry ready, plug-ins included
};

// One command: a line of the table in commands.cpp, which help, dispatch, completion and
// nearest-name hints read. The name may be two words ("tdb add").
struct Command {
  const char* name;
  const char* summary;  // in English; begins with a verb, no period
  Needs needs;
  // Declares options and help on the command's parser, its names in `context.names`, and sets
  // `context.run`. Both arguments outlive the run. Names never go through the parser's positional
  // options, which read brackets, braces and empty names as list syntax.
  void (*setUp)(CLI::App& app, CommandContext& context);
};

// Parses and runs one command line; the exit status of the program. Never throws.
int RunCommandLine(int count, const char* const* arguments, const Io& io);

// Prints "fotomill COMMAND: MESSAGE" and where to find help; returns kExitUsage. For mistakes that
// only the command itself can detect, before it touches anything.
int UsageError(const CommandContext& context, std::string_view message);

}  // namespace fotomill::cli
