#pragma once

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

#include "cli/frame/command.h"

namespace fotomill::cli {

// The parser of a command: CLI11 parses its options and the global ones; names are handled here,
// byte for byte.
class CommandParser : public CLI::App {
 public:
  // `command` may be null for global options only. `context` must outlive the parser.
  CommandParser(const Command* command, CommandContext& context);

  // Sets the options and context.names. Throws CLI::ParseError; for -h, its subclass
  // CLI::CallForHelp.
  void ParseArguments(std::vector<std::string> arguments);
  std::string HelpPage() const;  // output of --help, translated

 private:
  void RefuseFlagValues(const std::vector<std::string>& arguments) const;
  void Reword(const CLI::ParseError& error);
  void TakeNames();
  [[noreturn]] void RefuseOption(const std::string& typed) const;

  CommandContext& context_;
};

// Whether a global option takes the next argument as its value.
bool GlobalOptionTakesValue(std::string_view option);

}  // namespace fotomill::cli
