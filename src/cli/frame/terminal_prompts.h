#pragma once

#include <optional>
#include <string>

#include "batch/prompts.h"
#include "cli/frame/command.h"
#include "cli/frame/result_output.h"

namespace fotomill::cli {

// Asks on the standard error and reads lines from the standard input. The end of the input, and Ctrl-C, are the answer that
// changes nothing. What is answered about a file holds for that file or that run; it is never kept as a setting.
class TerminalPrompts : public Prompts {
 public:
  TerminalPrompts(const CommandContext& context, ResultOutput& output) : context_(context), output_(output) {}

  std::optional<std::string> AskDestinationName(const NameQuestion& question) override;
  OverwriteAnswer AskOverwrite(const OverwriteQuestion& question) override;
  std::optional<std::string> AskPassword(const std::string& path) override;
  bool ConfirmFormat(const std::string&) override { return true; }  // the command line has named it
  bool ConfirmNewFolder(const std::string& folder) override;

 private:
  // Prints a question and reads the line typed behind it, without its end and blanks around it; nullopt when there is none.
  std::optional<std::string> Ask(const std::string& question);

  const CommandContext& context_;
  ResultOutput& output_;
};

}  // namespace fotomill::cli
