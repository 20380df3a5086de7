#include "cli/frame/prepare.h"

#include <string_view>

#include "core/data_folder.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "settings/format_switches.h"
#include "settings/key_help.h"
#include "settings/plugin_settings.h"
#include "settings/previous_version.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// Warnings about --set keys that this build does not use, a sentence each.
void NoteUnusedSettings(const GlobalOptions& global, std::vector<std::string>& notes) {
  for (const std::string_view setting : global.settings) {
    const KeyRow* const row = FindKey(setting.substr(0, setting.find('=')));
    if (row != nullptr && !IsKeyUsed(*row)) notes.push_back("--set: " + UnusedKeyText(*row));
  }
}

}  // namespace

std::string PrepareFor(const Command& command, const GlobalOptions& global,
                       std::vector<std::string>& notes) {
  NoteUnusedSettings(global, notes);
  if (command.needs == Needs::Nothing) return {};
  SetDataFolder(global.dataFolder);
  if (const auto carried = CarryOverAtFirstStart()) notes.push_back(CarryOverText(*carried));
  (void)LoadConfiguration();  // on failure the defaults apply
  for (const std::string_view setting : global.settings) {
    const size_t equals = setting.find('=');
    if (equals == std::string_view::npos) return Tr("--set takes KEY=VALUE, not \"%1\".", setting);
    const SetResult result = SetSetting(setting.substr(0, equals), setting.substr(equals + 1));
    if (!result.Ok()) return "--set: " + result.message;
  }
  if (command.needs == Needs::Formats) TakeFormatSwitches();
  if (command.needs == Needs::Formats) RunFormatStartup();
  if (command.needs == Needs::Formats && !global.noPlugins) {
    ApplyPluginSettings();
    EnablePlugins();
  }
  return {};
}

void FinishAfter(const Command& command) {
  if (command.needs == Needs::Formats) RunFormatShutdown();
}

}  // namespace fotomill::cli
