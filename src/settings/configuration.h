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
// choices are decimal, texts stand as they are. All of this belongs to the main thread.

// The file's name in the data folder, and the section that holds the keys.
inline constexpr std::string_view kConfigurationFile = "Fotomill Professional 11.ini";
inline constexpr std::string_view kConfigurationSection = "Fotomill";  // of the INI file

// Path of the configuration file, whether it is there or not; empty without a data folder.
std::string ConfigurationPath();

// What became of loading the configuration file.
enum class ConfigurationState {
  NotLoaded,
  Missing,  // the defaults stand
  Loaded,
  Unreadable,  // it is there and cannot be read, is longer than 16 MiB or not a text of bytes: the
               // defaults stand, and nothing is written in this run
};

// A line of the configuration file whose value was ignored or changed.
struct ValueComplaint {
  const KeyRow* row;
  ValueFault fault;
  size_t line;        // counted from 1
  std::string value;  // its first 260 bytes
};

// Gives every key its default and then what the configuration file holds. Values given by
// SetSetting before are gone.
ConfigurationState LoadConfiguration();
// What the last load found.
ConfigurationState StateOfConfiguration();
std::span<const ValueComplaint> ConfigurationComplaints();  // of the last loading

// What became of a value given by name.
struct SetResult {
  enum Code { Done, UnknownKey, WrongValue } code = Done;
  // in the user's language, a whole sentence; for an unknown key it names the nearest one
  std::string message;

  // Whether there was nothing to complain of.
  bool Ok() const { return code == Done; }
};

// Gives a key a value for this run: it wins over the configuration file and is not written there by
// a later save.
SetResult SetSetting(std::string_view key, std::string_view value);

// What became of writing to the configuration file.
enum class SaveResult {
  Done,
  Unchanged,   // there was nothing to write
  NoFolder,    // the system has no place for it
  Unreadable,  // what is there cannot be read and is left alone
  Failed,      // not written; the old file stays
};
std::string_view SaveMessage(SaveResult result);  // a whole sentence in English, empty for success

// Writes the keys that this run has changed since the load, and only those: what other processes
// wrote meanwhile, unknown keys, comments and other sections stay. The file is replaced in one
// step.
SaveResult SaveConfiguration();
// Gives a key a value permanently: takes it up and writes it, whatever --set said. `result` tells
// what is wrong with the value; then nothing is written, and the key keeps its value if writing
// fails.
SaveResult StoreSetting(const KeyRow& row, const SettingValue& value);
// Takes a key out of the configuration file and gives it its default.
SaveResult RemoveSetting(const KeyRow& row);
// Whether a key has its value from SetSetting.
bool IsForThisRun(const KeyRow& row);
// The configuration file's text as this run knows it: as loaded, with this run's own changes. Valid
// until the next one.
std::string_view ConfigurationText();
// Makes changes to another section of the configuration file.
SaveResult StoreInSection(std::string_view section, std::span<const IniEdit> edits);
// From here on a value given by SetSetting counts like one that the user chose in a dialog, and is
// saved.
void KeepSetting(const KeyRow& row);

// The keys that are needed before anything else is set up, read straight from the configuration
// file.
struct EarlySettings {
  int32_t showStartupWindow, logoDelay, normalTextFontSize, smallTextFontSize, normalThumbFontSize;
};
// Defaults where the file cannot be read or does not name a key. Changes no setting.
EarlySettings ReadEarlySettings();

// The configuration file as one block for showing it or passing it on: a comment header, then the
// file's bytes. nullopt when it cannot be read whole.
std::optional<std::string> LoadConfigurationBlock();

}  // namespace fotomill
