#pragma once

#include <optional>
#include <string>

#include "batch/prompts.h"
#include "cli/frame/command.h"
#include "cli/frame/result_output.h"

namespace fotomill::cli {

// Asks on standard error and reads answers from standard input. End of input and Ctrl-C count as
// the answer that changes nothing. Answers apply to this file or run only and are never saved as
// settings.
class TerminalPrompts : public Prompts {
 public:
  // `context` and `output` must outlive this object.
  TerminalPrompts(const CommandContext& context, ResultOutput& output)
      : context_(context), output_(output) {}

  NameAnswer AskDestinationName(const NameQuestion& question) override;
  OverwriteAnswer AskOverwrite(const OverwriteQuestion& question) override;
  std::optional<std::string> AskPassword(const std::string& path) override;
  bool ConfirmFormat(const std::string&) override { return true; }  // given on the command line
  bool ConfirmNewFolder(const std::string&) override { return true; }  // likewise

 private:
  // Prints a question and reads the answer, without line end and surrounding blanks; nullopt at end
  // of input.
  std::optional<std::string> Ask(const std::string& question);

  const CommandContext& context_;
  ResultOutput& output_;
};

}  // namespace fotomill::cli
