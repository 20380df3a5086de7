#include "desktop/models/shell/key_map.h"

#include <algorithm>

#include "core/data_folder.h"
#include "core/limits.h"
#include "core/text.h"
#include "platform/files.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kFile = "MyKeys.txt";

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
  if (key && *key != command.builtIn) {
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
    return other.name != command.name && EqualIgnoringCase(KeyOf(other), key);
  });
  return found == commands.end() ? nullptr : &*found;
}

KeyMap& UserKeys() {
  static KeyMap keys = KeyMap::Load();
  return keys;
}

bool MayBeKey(std::string_view key) {
  const size_t plus = key.rfind('+', key.size() < 2 ? 0 : key.size() - 2);
  const std::string_view last = plus == std::string_view::npos ? key : key.substr(plus + 1);
  const std::string_view with = plus == std::string_view::npos ? "" : key.substr(0, plus);
  const bool single = last.size() < 2;
  return !last.empty() && (!single || (!with.empty() && with != "Shift"));
}

}  // namespace fotomill::desktop
