#include "desktop/models/setup/configuration_transfer.h"

#include <bitset>

#include "core/ini_file.h"
#include "core/limits.h"
#include "platform/files.h"
#include "settings/configuration.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

Transfer ExportConfiguration(const std::string& path) {
  const SaveResult saved = SaveConfiguration();
  if (saved != SaveResult::Done && saved != SaveResult::Unchanged)
    return {false, Tr(SaveMessage(saved))};
  const auto block = LoadConfigurationBlock();
  if (!block && platform::FileExists(ConfigurationPath()))
    return {false, Tr("The configuration file could not be read.")};
  if (!block) return {false, Tr("Nothing to export: all settings have their defaults.")};
  if (!platform::WriteWholeFile(path, *block)) {
    return {false, Tr("The file could not be written. Choose another folder or name.")};
  }
  return {true, Tr("The settings were written to \"%1\".", path)};
}

Transfer ImportConfiguration(const std::string& path) {
  std::string text;
  if (platform::ReadWholeFile(path, limits.listFileBytes, text) != platform::ReadResult::Done) {
    return {false, Tr("The file could not be read.")};
  }
  std::bitset<kKeyCount> seen;
  size_t taken = 0, refused = 0, unknown = 0;
  IniReader reader(text, kConfigurationSection);
  for (IniEntry entry; reader.Next(entry);) {
    const KeyRow* const row = FindKey(entry.key);
    if (row == nullptr) ++unknown;
    if (row == nullptr || seen[NumberOfKey(*row)] || (row->type & KEY_INTERNAL) != 0) continue;
    seen.set(NumberOfKey(*row));
    const SettingValue value = ReadValue(*row, entry.value, ValueSource::File);
    if (!value.usable) {
      ++refused;
      continue;
    }
    StoreValue(*row, value);
    KeepSetting(*row);
    ++taken;
  }
  if (IsWideText(text) || seen.none())
    return {false, Tr("The file has no settings of this program.")};
  const SaveResult saved = SaveConfiguration();
  Transfer transfer{saved == SaveResult::Done || saved == SaveResult::Unchanged, {}};
  transfer.message = TrGroupedCount("%1 setting was imported; all others are unchanged.",
                             "%1 settings were imported; all others are unchanged.", taken);
  if (refused > 0) {
    transfer.message.append(" ").append(
        TrGroupedCount("%1 value was invalid.", "%1 values were invalid.", refused));
  }
  if (unknown > 0)
    transfer.message.append(" ").append(
        TrGroupedCount("%1 key is unknown.", "%1 keys are unknown.", unknown));
  if (!transfer.ok) transfer.message.append(" ").append(Tr(SaveMessage(saved)));
  return transfer;
}

}  // namespace fotomill::desktop
