#include "desktop/models/setup/configuration_transfer.h"

#include <bitset>

#include "core/ini_file.h"
#include "core/limits.h"
#include "core/text.h"
#include "platform/files.h"
#include "settings/configuration.h"

namespace fotomill::desktop {

namespace {

std::string Counted(size_t count, const char* one, const char* many) {
  std::string text = WithThousands(count);
  return text.append(" ").append(count == 1 ? one : many);
}

}  // namespace

Transfer ExportConfiguration(const std::string& path) {
  const SaveResult saved = SaveConfiguration();
  if (saved != SaveResult::Done && saved != SaveResult::Unchanged) return {false, std::string(SaveMessage(saved))};
  const auto block = LoadConfigurationBlock();
  if (!block && platform::FileExists(ConfigurationPath())) return {false, "The configuration file could not be read."};
  if (!block) return {false, "There is nothing to export: every setting is as it was at first."};
  if (!platform::WriteWholeFile(path, *block)) return {false, "The file could not be written. Choose another folder or name."};
  return {true, "The settings were written to \"" + path + "\"."};
}

Transfer ImportConfiguration(const std::string& path) {
  std::string text;
  if (platform::ReadWholeFile(path, limits.listFileBytes, text) != platform::ReadResult::Done) {
    return {false, "The file could not be read."};
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
  if (IsWideText(text) || seen.none()) return {false, "The file holds no settings of this program."};
  const SaveResult saved = SaveConfiguration();
  Transfer transfer{saved == SaveResult::Done || saved == SaveResult::Unchanged, {}};
  transfer.message = Counted(taken, "setting was", "settings were") + " taken over; all others stay as they are.";
  if (refused > 0) transfer.message.append(" ").append(Counted(refused, "value", "values")).append(" could not be used.");
  if (unknown > 0) transfer.message.append(" ").append(Counted(unknown, "key is", "keys are")).append(" unknown here.");
  if (!transfer.ok) transfer.message.append(" ").append(SaveMessage(saved));
  return transfer;
}

}  // namespace fotomill::desktop
