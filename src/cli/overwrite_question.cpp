#include "cli/overwrite_question.h"

#include <optional>
#include <string_view>

#include "core/shown_text.h"

namespace fotomill::cli {

namespace {

// One line of the standard input, without its end; nullopt when there is none.
std::optional<std::string> ReadLine(std::FILE* stream) {
  std::string line;
  for (int c = std::fgetc(stream); c != '\n'; c = std::fgetc(stream)) {
    if (c == EOF) return line.empty() ? std::nullopt : std::optional(line);
    if (line.size() < 64) line += static_cast<char>(c);
  }
  return line;
}

std::optional<OverwriteAnswer> Understand(std::string_view line) {
  while (!line.empty() && (line.back() == ' ' || line.back() == '\r')) line.remove_suffix(1);
  while (!line.empty() && line.front() == ' ') line.remove_prefix(1);
  if (line == "r") return OverwriteAnswer{Overwrite::Replace, false};
  if (line == "R") return OverwriteAnswer{Overwrite::Replace, true};
  if (line == "k") return OverwriteAnswer{Overwrite::KeepBoth, false};
  if (line == "K") return OverwriteAnswer{Overwrite::KeepBoth, true};
  if (line == "s") return OverwriteAnswer{Overwrite::Skip, false};
  if (line == "S") return OverwriteAnswer{Overwrite::Skip, true};
  return std::nullopt;
}

}  // namespace

OverwriteAnswer AskAboutOverwriting(const CommandContext& context, const std::string& path) {
  for (;;) {
    std::fprintf(context.io.err, "%s exists. r: replace it, k: keep both, s: skip; capital: for all that follow. ",
                 EscapeControls(path).c_str());
    std::fflush(context.io.err);
    const std::optional<std::string> line = ReadLine(context.io.in);
    if (!line) {
      std::fputc('\n', context.io.err);
      return {Overwrite::Skip, true};
    }
    if (const auto answer = Understand(*line)) return *answer;
  }
}

}  // namespace fotomill::cli
