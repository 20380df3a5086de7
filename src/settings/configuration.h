#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/ini_file.h"
#include "settings/setting_value.h"

namespace fotomill {

// The configuration file "Fotomill Professional 11.ini" in the data folder: its section "Fotomill"
// holds one line "KEY=VALUE" for each key that differs from its default. Numbers, flags, colors and
// choices are decimal, texts are stored verbatim. For the main thread only.

// The file's name in the data folder, and the section with the keys.
inline constexpr std::string_view kConfigurationFile = "Fotomill Professional 11.ini";
inline constexpr std::string_view kConfigurationSection = "Fotomill";  // of the INI file

// Path of the configuration file, which may not exist; empty without a data folder.
std::string ConfigurationPath();

// Result of loading the configuration file.
enum class ConfigurationState {
  NotLoaded,
  Missing,  // the defaults apply
  Loaded,
  Unreadable,  // it exists but cannot be read, is over 16 MiB or not 8-bit text: the defaults
               // apply, and this run writes nothing
};

// A line of the configuration file with an invalid value, ignored or adjusted.
struct ValueComplaint {
  const KeyRow* row;
  ValueFault fault;
  size_t line;        // counted from 1
  std::string value;  // its first 260 bytes
};

// Resets every key to its default, then applies the configuration file. Values from
// SetSetting are discarded.
ConfigurationState LoadConfiguration();
// The result of the last load.
ConfigurationState StateOfConfiguration();
std::span<const ValueComplaint> ConfigurationComplaints();  // from the last load

// Result of setting a key by name.
struct SetResult {
  enum Code { Done, UnknownKey, WrongValue } code = Done;
  // in the user's language, a whole sentence; for an unknown key it suggests the nearest one
  std::string message;

  // Whether the value was accepted without complaint.
  bool Ok() const { return code == Done; }
};

// Sets a key for this run: it overrides the
// configuration file and is not saved.
SetResult SetSetting(std::string_view key, std::string_view value);

// Result of writing the configuration file.
enum class SaveResult {
  Done,
  Unchanged,   // there was nothing to write
  NoFolder,    // no data folder
  Unreadable,  // the existing file cannot be read; left unchanged
  Failed,      // not written; the old file is unchanged
};
std::string_view SaveMessage(SaveResult result);  // a whole sentence in English, empty for success

// Writes only the keys that this run has changed since loading;
// concurrent changes by other processes, unknown keys, comments
// and other sections are kept. The file is replaced atomically.
SaveResult SaveConfiguration();
// Sets a key permanently, overriding --set, and writes
// it. If `result` has a fault, nothing is written; if
// writing fails, the key keeps its old value.
SaveResult StoreSetting(const KeyRow& row, const SettingValue& value);
// Removes a key from the configuration file and resets it to its default.
SaveResult RemoveSetting(const KeyRow& row);
// Whether a key's value comes from SetSetting.
bool IsForThisRun(const KeyRow& row);
// The configuration file's text as known to this run: as loaded, plus this run's changes. Valid
// until the next change.
std::string_view ConfigurationText();
// Edits another section of the configuration file.
SaveResult StoreInSection(std::string_view section, std::span<const IniEdit> edits);
// Makes a value from SetSetting permanent, as if the user had chosen it in a dialog: it
// will be saved.
void KeepSetting(const KeyRow& row);

// Keys that are needed before the rest of the configuration, read directly from
// the configuration file.
struct EarlySettings {
  int32_t showStartupWindow, logoDelay, normalTextFontSize, smallTextFontSize, normalThumbFontSize;
};
// Defaults if the file cannot be read or a key is missing. Changes no setting.
EarlySettings ReadEarlySettings();

// The configuration file for display or support requests: a comment header, then the file's bytes.
// nullopt if it cannot be read completely.
std::optional<std::string> LoadConfigurationBlock();

}  // namespace fotomill
