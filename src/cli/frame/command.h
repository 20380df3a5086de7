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
inline constexpr int kExitFailed = 1;  // a file failed, or nothing was found
inline constexpr int kExitUsage = 2;   // nothing was changed

// Arguments that are not options: file names, keys, etc.
struct NameArguments {
  // as in the usage line: "FILE...", "DB FILE..."; empty: none allowed
  const char* placeholder = "";
  const char* help = "";  // in English
  size_t least = 0;
  size_t most = 0;
  std::vector<std::string> values;  // arbitrary bytes, in order

  // Declares what a command accepts. `shownAs` and `helpText` are for the help; a number of names
  // outside the limits is a usage error.
  void Declare(const char* shownAs, const char* helpText, size_t fewest,
               size_t greatest = SIZE_MAX) {
    placeholder = shownAs;
    help = helpText;
    least = fewest;
    most = greatest;
  }
};

// Options accepted by every command.
struct GlobalOptions {
  std::string dataFolder;             // empty: default
  std::vector<std::string> settings;  // KEY=VALUE, in order
  bool quiet = false;
  bool verbose = false;  // more messages, and elapsed time
  bool noInput = false;
  bool noPlugins = false;
  bool noHistory = false;
  std::string progress = "auto";  // auto, never
  std::string color = "auto";     // auto, always, never
  std::string language;           // as for StartTexts; applied before parsing
};

struct Command;

// The context of a command. `setUp` declares names and options and sets `run`; the framework parses
// the command line and calls `run`.
struct CommandContext {
  Io io;
  GlobalOptions global;
  const Command* command = nullptr;
  NameArguments names;
  std::function<int()> run;  // after parsing; returns the exit status

  // Whether questions can be asked.
  bool MayAsk() const { return io.Interactive() && !global.noInput; }
  // Whether to draw a progress bar.
  bool ProgressOn() const { return io.errTerminal && !global.quiet && global.progress != "never"; }
  // Whether messages, or results, are colored.
  bool ColorOn(bool terminal) const;
};

// What to initialize before a command runs.
enum class Needs : uint8_t {
  Nothing,
  Settings,  // configuration and --set
  Formats,   // Settings, and the format registry with plug-ins
};

// A command: a row of the table in commands.cpp, used for help, dispatch, completion and
// suggestions. The name may be two words ("tdb add").
struct Command {
  const char* name;
  const char* summary;  // in English; starts with a verb, no period
  Needs needs;
  // Declares options and help on the command's parser and names in `context.names`, and sets
  // `context.run`. Both arguments outlive the run. Names are not positional options of the parser,
  // as it treats brackets, braces and empty names as list syntax.
  void (*setUp)(CLI::App& app, CommandContext& context);
};

// Parses and runs a command line; returns the exit status. Never throws.
int RunCommandLine(int count, const char* const* arguments, const Io& io);

// Prints "fotomill COMMAND: MESSAGE" and where to find help; returns kExitUsage. For errors that
// only the command can detect, before it changes anything.
int UsageError(const CommandContext& context, std::string_view message);

}  // namespace fotomill::cli
