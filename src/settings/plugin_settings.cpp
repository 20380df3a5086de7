#include "settings/plugin_settings.h"

#include <charconv>
#include <cstddef>
#include <map>
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

// "MODULE.so=0" switches a module off, "MODULE.so.OPTION=NUMBER" sets an option.
void ApplyModuleLines() {
  std::vector<std::string> off;
  std::map<std::string, int32_t> options;
  IniReader reader(ConfigurationText(), kPluginSection);
  for (IniEntry entry; reader.Next(entry);) {
    int32_t number = 0;
    const auto end = entry.value.data() + entry.value.size();
    if (std::from_chars(entry.value.data(), end, number).ptr == end && !entry.value.empty())
      options[std::string(entry.key)] = number;
    if (entry.value == "0") off.emplace_back(entry.key);
  }
  SetModulesOff(std::move(off));
  SetModuleOptions(std::move(options));
}

}  // namespace

void ApplyPluginSettings() {
  InstallPluginConfiguration(ConfigurationTable(), static_cast<int32_t>(keyTable.count));
  ApplyModuleLines();
}

SaveResult SwitchPluginModule(const std::string& name, bool on) {
  SwitchModule(name, on);
  IniEdit edit{name, std::nullopt};
  if (!on) edit.value = "0";
  return StoreInSection(kPluginSection, {&edit, 1});
}

SaveResult StorePluginOptions(const std::string& name, const std::vector<ModuleOption>& options,
                              const std::vector<int32_t>& values) {
  std::vector<std::string> keys, texts;  // not moved once the edits refer to them
  for (size_t i = 0; i < options.size(); ++i) {
    keys.push_back(name + "." + options[i].name);
    texts.push_back(std::to_string(values[i]));
  }
  std::vector<IniEdit> edits;
  for (size_t i = 0; i < options.size(); ++i) {
    edits.push_back({keys[i], std::nullopt});
    if (values[i] != options[i].standard) edits.back().value = texts[i];
  }
  const SaveResult result = StoreInSection(kPluginSection, edits);
  ApplyModuleLines();
  return result;
}

bool ConfigurePluginRow(int32_t index) {
  if (index >= 0 && index < PluginFormatCount()) settings.PluginConfigIndex = index;
  return ConfigurePlugin(index);
}

}  // namespace fotomill
