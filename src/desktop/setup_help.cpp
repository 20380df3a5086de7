#include "desktop/setup_help.h"

#include "core/setup_dialog.h"

namespace fotomill::desktop {

namespace {

// The lines between a heading of the third rank and the next heading; empty when there is no such heading.
std::string_view EntryOf(std::string_view key) {
  const std::string heading = "\n### " + std::string(key) + "\n";
  const size_t start = kSettingsPage.find(heading);
  if (start == std::string_view::npos) return {};
  const std::string_view rest = kSettingsPage.substr(start + heading.size());
  return rest.substr(0, rest.find("\n#"));
}

std::string_view TakeLine(std::string_view& text) {
  const std::string_view line = text.substr(0, text.find('\n'));
  text.remove_prefix(line.size() == text.size() ? line.size() : line.size() + 1);
  return line;
}

// Lines that stand by themselves: headings, items of lists, what is set in.
bool BeginsALine(std::string_view line) {
  return line.starts_with("    ") || line.starts_with("#") || line.starts_with("- ") || line.starts_with("1. ") ||
         (line.size() > 2 && line[0] >= '1' && line[0] <= '9' && line.substr(1, 2) == ". ");
}

// A page as plain text: paragraphs on one line each, marks of emphasis and code taken out.
std::string PlainText(std::string_view page) {
  std::string text;
  bool paragraph = false;
  while (!page.empty()) {
    std::string_view line = TakeLine(page);
    if (line.empty()) {
      if (!text.empty() && !text.ends_with("\n\n")) text += text.ends_with('\n') ? "\n" : "\n\n";
      paragraph = false;
      continue;
    }
    const bool alone = BeginsALine(line), code = line.starts_with("    ");
    if (alone && paragraph) text += '\n';
    if (!alone && paragraph) text += ' ';
    line.remove_prefix(line.starts_with("#") ? line.find_first_not_of("# ") : !alone ? std::min(line.find_first_not_of(' '), line.size()) : 0);
    for (const char c : line) {
      if ((c != '`' && c != '*') || code) text += c;
    }
    paragraph = true;
  }
  while (text.ends_with('\n')) text.pop_back();
  return text;
}

}  // namespace

bool HasHelpEntry(std::string_view key) { return !EntryOf(key).empty(); }

HelpText HelpOn(std::string_view page) {
  if (const std::string_view entry = EntryOf(page); !entry.empty()) return {std::string(page), PlainText(entry)};
  std::string_view whole = kConfigurationPage;
  const std::string_view title = TakeLine(whole);
  return {std::string(title.substr(title.find_first_not_of("# "))), PlainText(whole)};
}

}  // namespace fotomill::desktop
