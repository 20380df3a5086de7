#include "cli/frame/terminal_prompts.h"

#include <string_view>

#include "core/shown_text.h"
#include "platform/process.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr size_t kLongestLine = 4096;

std::string Trimmed(std::string_view line) {
  while (!line.empty() && (line.back() == ' ' || line.back() == '\r')) line.remove_suffix(1);
  while (!line.empty() && line.front() == ' ') line.remove_prefix(1);
  return std::string(line);
}

// Answers if the output file exists.
struct Choice {
  char letter;  // uppercase: same answer for the rest
  bool ok;      // false: skip the file
  bool keepBoth;
  bool recycle;  // move the existing file to the trash
};
constexpr Choice kChoices[] = {
    {'r', true, false, false},
    {'k', true, true, false},
    {'t', true, false, true},
    {'s', false, false, false},
};

std::optional<OverwriteAnswer> Understand(const std::string& line, const OverwriteChecks& checks) {
  if (line.size() > 2 && line.starts_with("n ")) {
    OverwriteAnswer answer{true, checks, Trimmed(std::string_view(line).substr(2)), false};
    answer.checks.keepBoth = false;
    return answer;
  }
  if (line.size() != 1) return std::nullopt;
  for (const Choice& choice : kChoices) {
    const bool all = line[0] == choice.letter - 'a' + 'A';
    if (line[0] != choice.letter && !all) continue;
    OverwriteAnswer answer{choice.ok, checks, {}, all && !choice.ok};
    answer.checks.keepBoth = choice.keepBoth;
    answer.checks.recycle = choice.recycle || settings.OverwritePromptRecycle != 0;
    answer.checks.applyToRest = all;
    return answer;
  }
  return std::nullopt;
}

// Disables terminal echo while it exists.
class HiddenTyping {
 public:
  HiddenTyping() : hidden_(platform::ShowTyping(false)) {}
  ~HiddenTyping() {
    if (hidden_) (void)platform::ShowTyping(true);
  }
  HiddenTyping(const HiddenTyping&) = delete;
  HiddenTyping& operator=(const HiddenTyping&) = delete;

 private:
  bool hidden_;
};

}  // namespace

std::optional<std::string> TerminalPrompts::Ask(const std::string& question) {
  output_.MakeWay();
  std::fputs((question + " ").c_str(), context_.io.err);
  std::fflush(context_.io.err);
  std::clearerr(context_.io.in);  // after Ctrl-D, continue reading
  std::string line;
  int c = context_.io.in != stdin || platform::WaitForInput() ? std::fgetc(context_.io.in) : EOF;
  const bool ended = c == EOF;
  for (; c != '\n' && c != EOF; c = std::fgetc(context_.io.in)) {
    if (line.size() < kLongestLine) line += static_cast<char>(c);
  }
  if (ended) {
    std::fputc('\n', context_.io.err);
    return std::nullopt;
  }
  return Trimmed(line);
}

NameAnswer TerminalPrompts::AskDestinationName(const NameQuestion& question) {
  const std::string problem = question.problem.empty() ? "" : question.problem + " ";
  const auto line = Ask(
      problem + Tr("Name of the output (empty: %1; Ctrl-D: skip):", EscapeControls(question.path)));
  if (!line) return {};
  return {.ok = true, .name = line->empty() ? question.path : *line};
}

OverwriteAnswer TerminalPrompts::AskOverwrite(const OverwriteQuestion& question) {
  const std::string problem = question.problem.empty() ? "" : question.problem + " ";
  for (;;) {
    const auto line = Ask(problem + Tr("%1 exists. r: replace, t: replace, old file to the trash, "
                                       "k: keep both, n NAME: use another "
                                       "name, s: skip; capital letter: same answer for the rest.",
                                       EscapeControls(question.path)));
    if (!line) return {.ok = false, .checks = question.checks, .name = {}, .skipRest = true};
    auto answer = Understand(*line, question.checks);
    if (!answer) continue;
    if (answer->name.empty()) answer->name = question.name;
    return *answer;
  }
}

std::optional<std::string> TerminalPrompts::AskPassword(const std::string& path) {
  const HiddenTyping hidden;
  auto line = Ask(Tr("Password for %1:", EscapeControls(path)));
  std::fputc('\n', context_.io.err);
  return line && line->empty() ? std::nullopt : line;
}

}  // namespace fotomill::cli
