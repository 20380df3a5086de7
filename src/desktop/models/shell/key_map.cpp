#include "desktop/models/shell/key_map.h"

#include <algorithm>
#include <array>
#include <utility>

#include "core/data_folder.h"
#include "core/limits.h"
#include "core/text.h"
#include "platform/files.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kFile = "MyKeys.txt";

// Keys that lists and text fields need, unless they are pressed with Ctrl or Alt.
constexpr std::array<std::string_view, 13> kNeededAlone = {
    "Left", "Right", "Up", "Down", "Home", "End", "PageUp", "PageDown", "Return", "Space",
    "Back", "Tab", "Escape"};

// Second names of keys, for example those that the toolkit gives to pressed keys.
constexpr std::pair<std::string_view, std::string_view> kOtherNames[] = {
    {"Enter", "Return"}, {"Page Up", "PageUp"}, {"PgUp", "PageUp"}, {"Page Down", "PageDown"},
    {"PgDn", "PageDown"}, {"Backspace", "Back"}, {"Del", "Delete"}, {"Ins", "Insert"},
    {"Esc", "Escape"},
};

// A key as it is compared.
struct KeyParts {
  bool control = false, alt = false, shift = false;
  bool known = true;  // false if there are other modifiers
  std::string name;   // in upper case, without them; empty: none
  bool operator==(const KeyParts&) const = default;
};

KeyParts PartsOf(std::string_view key) {
  KeyParts parts;
  for (size_t plus = key.find('+'); plus != std::string_view::npos && plus > 0;
       plus = key.find('+')) {
    const std::string_view modifier = key.substr(0, plus);
    const bool numeric = EqualIgnoringCase(modifier, "Num ");  // "Num +"
    if (numeric) break;
    parts.control |= EqualIgnoringCase(modifier, "Ctrl");
    parts.alt |= EqualIgnoringCase(modifier, "Alt");
    parts.shift |= EqualIgnoringCase(modifier, "Shift");
    parts.known &= EqualIgnoringCase(modifier, "Ctrl") || EqualIgnoringCase(modifier, "Alt") ||
                   EqualIgnoringCase(modifier, "Shift");
    key.remove_prefix(plus + 1);
  }
  for (const auto& [other, name] : kOtherNames) {
    if (EqualIgnoringCase(key, other)) key = name;
  }
  parts.name = UpperCase(key);
  return parts;
}

bool SameKey(std::string_view a, std::string_view b) { return PartsOf(a) == PartsOf(b); }

}  // namespace

KeyMap KeyMap::Parse(std::string_view text) {
  KeyMap keys;
  while (!text.empty()) {
    const size_t end = std::min(text.find('\n'), text.size());
    std::string_view line = text.substr(0, end);
    text.remove_prefix(std::min(end + 1, text.size()));
    if (line.ends_with('\r')) line.remove_suffix(1);
    const size_t equals = line.find('=');
    if (equals == 0 || equals == std::string_view::npos) continue;
    const std::string_view key = line.substr(equals + 1);
    if (key.empty() || MayBeKey(key))
      keys.chosen_.insert_or_assign(std::string(line.substr(0, equals)), std::string(key));
  }
  return keys;
}

std::string KeyMap::Text() const {
  std::string text;
  for (const auto& [name, key] : chosen_) text.append(name).append("=").append(key).append("\n");
  return text;
}

KeyMap KeyMap::Load() {
  std::string text;
  const std::string path = DataFile(kFile);
  if (path.empty() || platform::ReadWholeFile(path, limits.listFileBytes, text) !=
                          platform::ReadResult::Done)
    return {};
  return Parse(text);
}

bool KeyMap::Save() const {
  const std::string path = DataFile(kFile);
  return !path.empty() && platform::MakeFolders(DataFolder()) &&
         platform::WriteWholeFile(path, Text());
}

std::string KeyMap::KeyOf(const KeyedCommand& command) const {
  const auto found = chosen_.find(command.name);
  return found == chosen_.end() ? command.builtIn : found->second;
}

void KeyMap::Set(const KeyedCommand& command, std::optional<std::string> key) {
  if (key && !SameKey(*key, command.builtIn)) {
    chosen_.insert_or_assign(command.name, std::move(*key));
  } else {
    chosen_.erase(command.name);
  }
}

void KeyMap::Assign(const std::vector<KeyedCommand>& commands, const KeyedCommand& command,
                    const std::string& key) {
  while (const KeyedCommand* const other = Conflict(commands, command, key)) Set(*other, "");
  Set(command, key);
}

const KeyedCommand* KeyMap::Conflict(const std::vector<KeyedCommand>& commands,
                                     const KeyedCommand& command, const std::string& key) const {
  if (key.empty()) return nullptr;
  const auto found = std::ranges::find_if(commands, [&](const KeyedCommand& other) {
    return other.name != command.name && SameKey(KeyOf(other), key);
  });
  return found == commands.end() ? nullptr : &*found;
}

KeyMap& UserKeys() {
  static KeyMap keys = KeyMap::Load();
  return keys;
}

bool MayBeKey(std::string_view key) {
  const KeyParts parts = PartsOf(key);
  const bool ascii = std::ranges::none_of(parts.name, [](char c) { return (c & 0x80) != 0; });
  if (parts.name.empty() || !parts.known || !ascii) return false;
  if (parts.control || parts.alt) return true;
  return parts.name.size() > 1 && std::ranges::none_of(kNeededAlone, [&](std::string_view name) {
    return EqualIgnoringCase(parts.name, name);
  });
}

}  // namespace fotomill::desktop
