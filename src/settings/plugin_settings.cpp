#include "settings/plugin_settings.h"

#include <cstddef>
#include <optional>
#include <utility>
#include <vector>

#include "core/ini_file.h"
#include "plugins/plugin_bridge.h"
#include "plugins/plugin_table.h"
#include "settings/key_table.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

// The key table as seen by modules. The row layouts are identical.
const FMW_CONFIG_ENTRY* ConfigurationTable() {
  static_assert(sizeof(FMW_CONFIG_ENTRY) == sizeof(KeyRow) &&
                offsetof(FMW_CONFIG_ENTRY, type) == offsetof(KeyRow, type) &&
                offsetof(FMW_CONFIG_ENTRY, extra) == offsetof(KeyRow, extra));
  return static_cast<const FMW_CONFIG_ENTRY*>(static_cast<const void*>(keyTable.rows));
}

void ApplySwitches() {
  std::vector<std::string> off;
  IniReader reader(ConfigurationText(), kPluginSection);
  for (IniEntry entry; reader.Next(entry);) {
    if (entry.value == "0") off.emplace_back(entry.key);
  }
  SetModulesOff(std::move(off));
}

}  // namespace

void ApplyPluginSettings() {
  InstallPluginConfiguration(ConfigurationTable(), static_cast<int32_t>(keyTable.count));
  ApplySwitches();
}

SaveResult SwitchPluginModule(const std::string& name, bool on) {
  SwitchModule(name, on);
  IniEdit edit{name, std::nullopt};
  if (!on) edit.value = "0";
  return StoreInSection(kPluginSection, {&edit, 1});
}

bool ConfigurePluginRow(int32_t index) {
  if (index >= 0 && index < PluginFormatCount()) settings.PluginConfigIndex = index;
  return ConfigurePlugin(index);
}

}  // namespace fotomill
