#include "desktop/models/setup/setup_help.h"

#include "settings/key_help.h"
#include "settings/setup_dialog.h"
#include "settings/spin_range.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// Topics of Help buttons, and their headings in the manual.
struct Topic {
  std::string_view topic, heading;
};
constexpr Topic kTopics[] = {
    {"OVERWRITE", "Overwriting"},
    {"RENAME", "Renaming in sequence"},
    {"SEARCH", "Finding pictures"},
};

// The text between a third-level heading and the next heading; empty if not found.
std::string_view EntryOf(std::string_view page, std::string_view title) {
  const std::string heading = "\n### " + std::string(title) + "\n";
  const size_t start = page.find(heading);
  if (start == std::string_view::npos) return {};
  const std::string_view rest = page.substr(start + heading.size());
  return rest.substr(0, rest.find("\n#"));
}

std::string_view ReadLine(std::string_view& text) {
  const std::string_view line = text.substr(0, text.find('\n'));
  text.remove_prefix(line.size() == text.size() ? line.size() : line.size() + 1);
  return line;
}

// Lines that are not joined: headings, list items, table rows, indented lines.
bool StandsAlone(std::string_view line) {
  return line.starts_with("    ") || line.starts_with("#") || line.starts_with("- ") ||
         line.starts_with("|") ||
         (line.size() > 2 && line[0] >= '1' && line[0] <= '9' && line.substr(1, 2) == ". ");
}

bool IsLeftOut(std::string_view line) { return line.starts_with("![") || line.starts_with("|---"); }

// Removes marks for emphasis, code, links and tables. Indented code is not changed.
std::string WithoutMarks(std::string_view line) {
  std::string text;
  bool address = false, code = false;
  for (size_t i = 0; i < line.size(); ++i) {
    const char c = line[i];
    if (c == '`') {
      code = !code;
    } else if (code) {
      text += c;
    } else if (address) {
      address = c != ')';
    } else if (c == ']' && line.substr(i).starts_with("](")) {
      address = true;
    } else if (c == '|') {
      while (text.ends_with(' ')) text.pop_back();
      if (!text.empty()) text += "  ";
    } else if (c != '*' && c != '[' && c != ']') {
      text += c;
    }
  }
  while (text.ends_with(' ')) text.pop_back();
  return text.substr(std::min(text.find_first_not_of(' '), text.size()));
}

// Converts a page to plain text, with one line per paragraph.
std::string PlainText(std::string_view page) {
  std::string text;
  bool paragraph = false;
  while (!page.empty()) {
    std::string_view line = ReadLine(page);
    if (IsLeftOut(line)) continue;
    if (line.empty()) {
      if (!text.empty() && !text.ends_with("\n\n")) text += text.ends_with('\n') ? "\n" : "\n\n";
      paragraph = false;
      continue;
    }
    const bool alone = StandsAlone(line);
    if (paragraph) text += alone ? '\n' : ' ';
    if (line.starts_with("#")) line.remove_prefix(line.find_first_not_of("# "));
    text += line.starts_with("    ") ? std::string(line) : WithoutMarks(line);
    paragraph = true;
  }
  while (text.ends_with('\n')) text.pop_back();
  return text;
}

HelpText WholePage(std::string_view page) {
  const std::string_view title = ReadLine(page);
  return {std::string(title.substr(title.find_first_not_of("# "))), PlainText(page)};
}

}  // namespace

std::string LimitsText(const KeyRow& row) {
  const auto limits = LimitsOf(row);
  return limits ? Tr("%1 to %2", limits->minimum, limits->maximum) : std::string();
}

std::string ControlTip(const KeyRow& row) {
  std::string text;
  if (TextLanguage() == "en" && HasHelpEntry(row.name)) {
    const std::string help = HelpOn(row.name).text;
    text = help.substr(0, help.find("\n\n")) + "\n\n";
  }
  return text + row.name;
}

bool HasHelpEntry(std::string_view key) { return !EntryOf(kSettingsPage, key).empty(); }

HelpText HelpOn(std::string_view topic) {
  for (const Topic& row : kTopics) {
    if (row.topic == topic)
      return {std::string(row.heading), PlainText(EntryOf(kDesktopPage, row.heading))};
  }
  if (HasHelpEntry(topic)) return {std::string(topic), PlainText(EntryOf(kSettingsPage, topic))};
  if (topic == kFormatsTopic) return WholePage(kFormatsPage);
  return WholePage(topic == kManual ? kDesktopPage : kConfigurationPage);
}

}  // namespace fotomill::desktop
