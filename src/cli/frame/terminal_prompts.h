#pragma once

#include <optional>
#include <string>

#include "batch/prompts.h"
#include "cli/frame/command.h"
#include "cli/frame/result_output.h"

namespace fotomill::cli {

// Asks on standard error and reads answers from standard input. End of input and Ctrl-C mean the
// answer that changes nothing. Answers apply to that file or that run and are never stored as
// settings.
class TerminalPrompts : public Prompts {
 public:
  // Questions go to the terminal; context and output must outlive it.
  TerminalPrompts(const CommandContext& context, ResultOutput& output)
      : context_(context), output_(output) {}

  std::optional<std::string> AskDestinationName(const NameQuestion& question) override;
  OverwriteAnswer AskOverwrite(const OverwriteQuestion& question) override;
  std::optional<std::string> AskPassword(const std::string& path) override;
  bool ConfirmFormat(const std::string&) override { return true; }  // named on the command line
  bool ConfirmNewFolder(const std::string&) override { return true; }  // likewise

 private:
  // Prints a question and reads the answer, without line end and surrounding blanks; nullopt at the
  // end of input.
  std::optional<std::string> Ask(const std::string& question);

  const CommandContext& context_;
  ResultOutput& output_;
};

}  // namespace fotomill::cli
