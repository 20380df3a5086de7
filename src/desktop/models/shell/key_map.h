#pragma once

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// A command whose key can be changed.
struct KeyedCommand {
  std::string name;     // identifies it: "File/Open", whatever the language
  std::string label;    // for people, translated
  std::string builtIn;  // key, "Ctrl+O"; empty: none
};

// The keys that the user has chosen for commands, in place of the built-in ones; kept in the text
// file "MyKeys.txt" in the data folder, one "command=key" per line.
class KeyMap {
 public:
  // Parses such a text, ignoring invalid lines.
  static KeyMap Parse(std::string_view text);
  std::string Text() const;
  // Reads the file; without it, all keys are built in.
  static KeyMap Load();
  [[nodiscard]] bool Save() const;  // false if the file cannot be written

  // The key of a command; empty: none.
  std::string KeyOf(const KeyedCommand& command) const;
  bool IsBuiltIn(const KeyedCommand& command) const { return !chosen_.contains(command.name); }
  // Sets the key of a command, or with nullopt the built-in one.
  void Set(const KeyedCommand& command, std::optional<std::string> key);
  // Gives a key to one command and takes it from the others.
  void Assign(const std::vector<KeyedCommand>& commands, const KeyedCommand& command,
              const std::string& key);
  // Another command with this key; null if there is none.
  const KeyedCommand* Conflict(const std::vector<KeyedCommand>& commands,
                               const KeyedCommand& command, const std::string& key) const;

  bool operator==(const KeyMap&) const = default;

 private:
  std::map<std::string, std::string, std::less<>> chosen_;  // key by command
};

// The user's keys, shared by all windows; loaded at the first call. Window's thread only.
KeyMap& UserKeys();

// Whether a key may be given to a command: without Ctrl or Alt, characters are for searching in
// lists, and arrows and the like for moving in lists and text fields.
bool MayBeKey(std::string_view key);

}  // namespace fotomill::desktop
