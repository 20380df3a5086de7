#include "platform/posix/desktop_entries.h"

#include <algorithm>
#include <charconv>

namespace fotomill::platform {

namespace {

std::string_view TakeLine(std::string_view& text) {
  const std::string_view line = text.substr(0, text.find('\n'));
  text.remove_prefix(std::min(line.size() + 1, text.size()));
  return line;
}

std::string_view TakeUpTo(std::string_view& text, char mark) {
  const std::string_view part = text.substr(0, text.find(mark));
  text.remove_prefix(std::min(part.size() + 1, text.size()));
  return part;
}

std::string_view Trimmed(std::string_view text) {
  const size_t first = std::min(text.find_first_not_of(" \t\r"), text.size());
  text.remove_prefix(first);
  return text.substr(0, text.find_last_not_of(" \t\r") + 1);
}

// The value of a key in a group of an entry or a list; the first one counts.
std::string_view ValueIn(std::string_view text, std::string_view group, std::string_view key) {
  bool inside = false;
  while (!text.empty()) {
    std::string_view line = Trimmed(TakeLine(text));
    if (line.starts_with('[')) inside = line.size() == group.size() + 2 && line.substr(1, group.size()) == group;
    const size_t equals = line.find('=');
    if (inside && equals != std::string_view::npos && Trimmed(line.substr(0, equals)) == key)
      return Trimmed(line.substr(equals + 1));
  }
  return {};
}

void AddItems(std::string_view list, std::vector<std::string>& items) {
  while (!list.empty()) {
    const std::string_view item = Trimmed(TakeUpTo(list, ';'));
    if (!item.empty() && std::ranges::find(items, item) == items.end()) items.emplace_back(item);
  }
}

bool EndsIgnoringCase(std::string_view name, std::string_view end) {
  const auto lower = [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; };
  return name.size() >= end.size() &&
         std::ranges::equal(name.substr(name.size() - end.size()), end, [&](char a, char b) { return lower(a) == lower(b); });
}

bool Matches(std::string_view name, std::string_view pattern) {
  const bool suffix = pattern.starts_with('*');
  if (suffix) pattern.remove_prefix(1);
  if (pattern.empty() || pattern.find_first_of("*?[") != std::string_view::npos) return false;
  return EndsIgnoringCase(name, pattern) && (suffix || name.size() == pattern.size());
}

// Escapes of all values of an entry: "\s" is a blank, "\\" a backslash.
std::string Unescaped(std::string_view value) {
  std::string text;
  for (size_t i = 0; i < value.size(); ++i) {
    if (value[i] != '\\' || i + 1 == value.size()) {
      text += value[i];
      continue;
    }
    const char c = value[++i];
    text += c == 's' ? ' ' : c == 'n' ? '\n' : c == 't' ? '\t' : c == 'r' ? '\r' : c;
  }
  return text;
}

}  // namespace

std::string MimeTypeIn(std::string_view globs, std::string_view name) {
  std::string_view best;
  int bestWeight = -1;
  size_t bestLength = 0;
  while (!globs.empty()) {
    std::string_view line = TakeLine(globs);
    const std::string_view number = TakeUpTo(line, ':'), type = TakeUpTo(line, ':'), pattern = TakeUpTo(line, ':');
    int weight = -1;
    std::from_chars(number.data(), number.data() + number.size(), weight);
    const bool heavier = weight > bestWeight || (weight == bestWeight && pattern.size() > bestLength);
    if (weight < 0 || !heavier || !Matches(name, pattern)) continue;
    best = type;
    bestWeight = weight;
    bestLength = pattern.size();
  }
  return std::string(best);
}

Associations AssociationsIn(std::string_view list, std::string_view type) {
  Associations associations;
  for (const char* group : {"Default Applications", "Added Associations", "MIME Cache"}) {
    AddItems(ValueIn(list, group, type), associations.programs);
  }
  AddItems(ValueIn(list, "Removed Associations", type), associations.removed);
  return associations;
}

std::optional<std::vector<std::string>> SplitExec(std::string_view line) {
  std::vector<std::string> words;
  std::string word;
  bool inWord = false, quoted = false;
  for (size_t i = 0; i < line.size(); ++i) {
    const char c = line[i];
    if (c == '"') {
      quoted = !quoted;
      inWord = true;
    } else if (quoted && c == '\\' && i + 1 < line.size()) {
      word += line[++i];
    } else if (!quoted && (c == ' ' || c == '\t')) {
      if (inWord) words.push_back(std::move(word));
      word.clear();
      inWord = false;
    } else {
      word += c;
      inWord = true;
    }
  }
  if (inWord) words.push_back(std::move(word));
  return quoted ? std::nullopt : std::optional(words);
}

std::optional<Program> ProgramOfEntry(std::string_view entry) {
  const auto value = [&](std::string_view key) { return ValueIn(entry, "Desktop Entry", key); };
  if (value("Type") != "Application" || value("Hidden") == "true" || value("Terminal") == "true") return std::nullopt;
  auto words = SplitExec(Unescaped(value("Exec")));
  if (!words || words->empty() || value("Name").empty()) return std::nullopt;
  return Program{Unescaped(value("Name")), std::move(*words)};
}

}  // namespace fotomill::platform
