#include "plugins/module_facts.h"

#include <algorithm>
#include <charconv>

namespace fotomill {

namespace {

// Line breaks and backslashes, which would end a line or an escape.
std::string Escaped(std::string_view text) {
  std::string line;
  for (const char c : text) {
    if (c == '\n') {
      line += "\\n";
    } else if (c == '\\') {
      line += "\\\\";
    } else {
      line += c;
    }
  }
  return line;
}

std::string Unescaped(std::string_view line) {
  std::string text;
  for (size_t i = 0; i < line.size(); ++i) {
    const bool escape = line[i] == '\\' && i + 1 < line.size();
    if (escape) ++i;
    text += escape && line[i] == 'n' ? '\n' : line[i];
  }
  return text;
}

void PutText(std::string& out, std::string_view key, std::string_view value) {
  out.append(key).append("=").append(Escaped(value)).append("\n");
}

void PutNumber(std::string& out, std::string_view key, int64_t value) {
  PutText(out, key, std::to_string(value));
}

template <class Number>
bool Take(std::string_view value, Number& number) {
  const auto end = value.data() + value.size();
  return std::from_chars(value.data(), end, number).ptr == end && !value.empty();
}

struct TextRow {
  std::string_view key;
  std::string ModuleFacts::*text;
};
constexpr TextRow kTexts[] = {
    {"textA", &ModuleFacts::textA},           {"textB", &ModuleFacts::textB},
    {"extensions", &ModuleFacts::extensions}, {"version", &ModuleFacts::version},
    {"copyright", &ModuleFacts::copyright},   {"libraries", &ModuleFacts::libraries},
};

struct SwitchRow {
  std::string_view key;
  bool ModuleFacts::*on;
};
constexpr SwitchRow kSwitches[] = {
    {"writes", &ModuleFacts::writes},
    {"comments", &ModuleFacts::hasComments},
    {"dialog", &ModuleFacts::hasDialog},
    {"metadata", &ModuleFacts::hasMetadata},
    {"takesMetadata", &ModuleFacts::takesMetadata},
    {"writesFrames", &ModuleFacts::writesFrames},
    {"transcodes", &ModuleFacts::transcodes},
};

// "NAME|KIND|LEAST|MOST|STANDARD|LABEL|CHOICE|CHOICE..."; "|" in a text becomes "/".
std::string OptionText(const ModuleOption& option) {
  const auto plain = [](std::string text) {
    std::ranges::replace(text, '|', '/');
    return text;
  };
  std::string line = plain(option.name);
  for (const int32_t number : {option.kind, option.least, option.most, option.standard})
    line.append("|").append(std::to_string(number));
  line.append("|").append(plain(option.label));
  for (const std::string& choice : option.choices) line.append("|").append(plain(choice));
  return line;
}

bool OptionFromText(std::string_view line, ModuleOption& option) {
  std::vector<std::string_view> parts;
  for (size_t end = 0; end != std::string_view::npos; line.remove_prefix(end + 1)) {
    end = line.find('|');
    parts.push_back(line.substr(0, end));
    if (end == std::string_view::npos) break;
  }
  if (parts.size() < 6 || !Take(parts[1], option.kind) || !Take(parts[2], option.least) ||
      !Take(parts[3], option.most) || !Take(parts[4], option.standard))
    return false;
  option.name = parts[0];
  option.label = parts[5];
  option.choices.assign(parts.begin() + 6, parts.end());
  return true;
}

bool TakeLine(std::string_view key, std::string_view value, ModuleFacts& facts) {
  for (const TextRow& row : kTexts) {
    if (row.key == key) facts.*row.text = Unescaped(value);
  }
  for (const SwitchRow& row : kSwitches) {
    if (row.key == key) facts.*row.on = value == "1";
  }
  if (key == "flags1") return Take(value, facts.flags1);
  if (key == "flags2") return Take(value, facts.flags2);
  if (key != "option") return true;
  if (facts.options.size() == FMW_OPTION_COUNT) return false;
  return OptionFromText(Unescaped(value), facts.options.emplace_back());
}

}  // namespace

int32_t ModuleOption::Nearest(int32_t value) const {
  if (kind == FMW_OPTION_SWITCH) return value != 0 ? 1 : 0;
  const int32_t first = kind == FMW_OPTION_CHOICE ? 0 : least;
  const int32_t last = kind == FMW_OPTION_CHOICE ? static_cast<int32_t>(choices.size()) - 1 : most;
  return std::min(std::max(value, first), std::max(first, last));
}

std::string FactsAsText(const ModuleFacts& facts) {
  std::string out;
  for (const TextRow& row : kTexts) PutText(out, row.key, facts.*row.text);
  for (const SwitchRow& row : kSwitches) PutNumber(out, row.key, facts.*row.on ? 1 : 0);
  PutNumber(out, "flags1", facts.flags1);
  PutNumber(out, "flags2", facts.flags2);
  for (const ModuleOption& option : facts.options) PutText(out, "option", OptionText(option));
  return out;
}

bool FactsFromText(std::string_view text, ModuleFacts& facts) {
  facts = {};
  while (!text.empty()) {
    const std::string_view line = text.substr(0, text.find('\n'));
    text.remove_prefix(std::min(line.size() + 1, text.size()));
    const size_t equals = line.find('=');
    if (equals == std::string_view::npos ||
        !TakeLine(line.substr(0, equals), line.substr(equals + 1), facts))
      return false;
  }
  return !facts.extensions.empty();
}

std::string_view ListItem(std::string_view list, int32_t index) {
  list.remove_prefix(std::min(list.find_first_not_of(';'), list.size()));
  for (; index > 0; --index) {
    const size_t end = list.find(';');
    if (end == std::string_view::npos) return {};
    list.remove_prefix(end);
    list.remove_prefix(std::min(list.find_first_not_of(';'), list.size()));
  }
  return list.substr(0, list.find(';'));
}

}  // namespace fotomill
