#pragma once

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

#include "cli/frame/command.h"

namespace fotomill::cli {

// The parser of one command: CLI11 reads its options and the global ones; names are read here, byte
// for byte as typed.
class CommandParser : public CLI::App {
 public:
  // `command` may be null: then there are the global options only. `context` outlives the parser.
  CommandParser(const Command* command, CommandContext& context);

  // Fills the options and context.names. Throws CLI::ParseError, CLI::CallForHelp for -h among
  // them.
  void ParseArguments(std::vector<std::string> arguments);
  std::string HelpPage() const;  // what --help prints, in the user's language

 private:
  void RefuseFlagValues(const std::vector<std::string>& arguments) const;
  void Reword(const CLI::ParseError& error);
  void TakeNames();
  [[noreturn]] void RefuseOption(const std::string& typed) const;

  CommandContext& context_;
};

// Whether an option before the command takes the next argument as its value.
bool GlobalOptionTakesValue(std::string_view option);

}  // namespace fotomill::cli
