#include "settings/configuration.h"

#include <bitset>

#include "core/data_folder.h"
#include "core/file_edit.h"
#include "core/fixed_text.h"
#include "core/limits.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr std::string_view kBlockHeader = ";\r\n;\r\n;------ INI FILE ------\r\n;\r\n;\r\n";

struct Configuration {
  ConfigurationState state = ConfigurationState::NotLoaded;
  std::string text;  // of the file as known to this run: as loaded, plus this run's changes
  std::vector<ValueComplaint> complaints;
  std::bitset<kKeyCount> forThisRun;  // keys set by SetSetting
};

Configuration& TheConfiguration() {
  static Configuration configuration;
  return configuration;
}

// Calls take(row, entry) for the first entry of every known key.
template <typename Take>
void ForEachKey(std::string_view text, Take take) {
  std::bitset<kKeyCount> seen;
  size_t next = 0;  // files are mostly in table order
  IniReader reader(text, kConfigurationSection);
  for (IniEntry entry; reader.Next(entry);) {
    const KeyRow* const row = FindKey(entry.key, next);
    if (row == nullptr || seen[NumberOfKey(*row)]) continue;
    seen.set(NumberOfKey(*row));
    next = NumberOfKey(*row) + 1;
    take(*row, entry);
  }
}

void TakeValues(Configuration& configuration) {
  ForEachKey(configuration.text, [&](const KeyRow& row, const IniEntry& entry) {
    const SettingValue value = ReadValue(row, entry.value, ValueSource::File);
    if (value.usable) StoreValue(row, value);
    if (value.fault == ValueFault::None || value.fault == ValueFault::Internal) return;
    configuration.complaints.push_back(
        {&row, value.fault, entry.line, std::string(entry.value.substr(0, PathText::Capacity()))});
  });
}

ConfigurationState ReadConfigurationText(std::string& text) {
  const std::string path = ConfigurationPath();
  if (path.empty()) return ConfigurationState::Missing;
  switch (platform::ReadWholeFile(path, limits.listFileBytes, text)) {
    case platform::ReadResult::Missing: return ConfigurationState::Missing;
    case platform::ReadResult::Done:
      if (!IsWideText(text)) return ConfigurationState::Loaded;
      text.clear();
      return ConfigurationState::Unreadable;
    case platform::ReadResult::Failed:
    case platform::ReadResult::TooLarge: break;
  }
  return ConfigurationState::Unreadable;
}

// Applies the edits to the file and to this run's copy of its text.
SaveResult WriteEdits(std::span<const IniEdit> edits,
                      std::string_view section = kConfigurationSection) {
  Configuration& configuration = TheConfiguration();
  const std::string path = ConfigurationPath();
  if (path.empty()) return SaveResult::NoFolder;
  if (configuration.state == ConfigurationState::Unreadable) return SaveResult::Unreadable;
  bool wide = false;
  const EditResult result = EditTextFile(path, limits.listFileBytes, [&](std::string& text) {
    wide = IsWideText(text);
    if (!wide) text = EditIni(text, section, edits);
  });
  if (wide || result == EditResult::NotRead) return SaveResult::Unreadable;
  if (result == EditResult::Failed) return SaveResult::Failed;
  configuration.text = EditIni(configuration.text, section, edits);
  return result == EditResult::Done ? SaveResult::Done : SaveResult::Unchanged;
}

// Keys whose value equals that in this run's copy of the file.
std::bitset<kKeyCount> UnchangedKeys(const Configuration& configuration) {
  std::bitset<kKeyCount> unchanged;
  for (const KeyRow& row : Keys())
    unchanged[NumberOfKey(row)] = IsAtDefault(row) || (row.type & KEY_INTERNAL) != 0;
  ForEachKey(configuration.text, [&](const KeyRow& row, const IniEntry& entry) {
    const SettingValue value = ReadValue(row, entry.value, ValueSource::File);
    if (value.usable) unchanged[NumberOfKey(row)] = HoldsValue(row, value);
  });
  return unchanged | configuration.forThisRun;
}

}  // namespace

std::string ConfigurationPath() { return DataFile(kConfigurationFile); }

ConfigurationState LoadConfiguration() {
  Configuration& configuration = TheConfiguration();
  if (configuration.state != ConfigurationState::NotLoaded) settings = defaultSettings;
  configuration.complaints.clear();
  configuration.forThisRun.reset();
  configuration.state = ReadConfigurationText(configuration.text);
  if (!configuration.text.empty()) TakeValues(configuration);
  StoreText(KeyOf(KeyNumber::BuildDate), FOTOMILL_BUILD_DATE);
  settings.ApplicationPath.AssignCut(platform::ProgramPath());
  return configuration.state;
}

ConfigurationState StateOfConfiguration() { return TheConfiguration().state; }
std::span<const ValueComplaint> ConfigurationComplaints() { return TheConfiguration().complaints; }

SetResult SetSetting(std::string_view key, std::string_view value) {
  const KeyRow* const row = FindKey(key);
  if (row == nullptr) {
    return {SetResult::UnknownKey,
            Tr("Unknown key \"%1\"; the nearest is %2.", key, NearestKey(key))};
  }
  const SettingValue read = ReadValue(*row, value, ValueSource::Person);
  if (!read.usable) return {SetResult::WrongValue, FaultMessage(*row, read.fault)};
  StoreValue(*row, read);
  TheConfiguration().forThisRun.set(NumberOfKey(*row));
  return {};
}

std::string_view SaveMessage(SaveResult result) {
  switch (result) {
    case SaveResult::Done:
    case SaveResult::Unchanged: return {};
    case SaveResult::NoFolder: return TrLater("There is no folder for the configuration file.");
    case SaveResult::Unreadable:
      return TrLater("The configuration file cannot be read; left unchanged.");
    case SaveResult::Failed: return TrLater("The configuration file could not be written.");
  }
  return {};
}

SaveResult SaveConfiguration() {
  const std::bitset<kKeyCount> unchanged = UnchangedKeys(TheConfiguration());
  std::vector<std::string> values;
  std::vector<IniEdit> edits;
  values.reserve(kKeyCount);  // no reallocation: the edits point into it
  for (const KeyRow& row : Keys()) {
    if (unchanged[NumberOfKey(row)]) continue;
    edits.push_back({row.name, values.emplace_back(ValueText(row))});
  }
  return edits.empty() ? SaveResult::Unchanged : WriteEdits(edits);
}

SaveResult StoreSetting(const KeyRow& row, const SettingValue& value) {
  const std::string text =
      (row.type & KEY_TEXT) != 0 ? std::string(value.text) : std::to_string(value.number);
  const IniEdit edit{row.name, text};
  const SaveResult result = WriteEdits({&edit, 1});
  if (result != SaveResult::Done && result != SaveResult::Unchanged) return result;
  StoreValue(row, value);
  KeepSetting(row);
  return result;
}

SaveResult RemoveSetting(const KeyRow& row) {
  const IniEdit edit{row.name, std::nullopt};
  const SaveResult result = WriteEdits({&edit, 1});
  if (result != SaveResult::Done && result != SaveResult::Unchanged) return result;
  StoreDefault(row);
  KeepSetting(row);
  return result;
}

std::string_view ConfigurationText() { return TheConfiguration().text; }

SaveResult StoreInSection(std::string_view section, std::span<const IniEdit> edits) {
  return WriteEdits(edits, section);
}

bool IsForThisRun(const KeyRow& row) { return TheConfiguration().forThisRun[NumberOfKey(row)]; }

void KeepSetting(const KeyRow& row) { TheConfiguration().forThisRun.reset(NumberOfKey(row)); }

EarlySettings ReadEarlySettings() {
  std::string text;
  (void)ReadConfigurationText(text);
  const auto read = [&](KeyNumber key) {
    const KeyRow& row = KeyOf(key);
    const auto found = FindIniValue(text, kConfigurationSection, row.name);
    const SettingValue value = ReadValue(row, found.value_or(""), ValueSource::File);
    return found && value.usable ? value.number : DefaultNumber(row);
  };
  return {read(KeyNumber::ShowStartupWindow), read(KeyNumber::LogoDelay),
          read(KeyNumber::NormalTextFontSize), read(KeyNumber::SmallTextFontSize),
          read(KeyNumber::NormalThumbFontSize)};
}

std::optional<std::string> LoadConfigurationBlock() {
  const std::string path = ConfigurationPath();
  std::string contents;
  if (path.empty() ||
      platform::ReadWholeFile(path, limits.listFileBytes, contents) != platform::ReadResult::Done) {
    return std::nullopt;
  }
  // it changed while being read
  if (contents.size() != platform::FactsOf(path).size) return std::nullopt;
  return std::string(kBlockHeader) + contents;
}

}  // namespace fotomill
