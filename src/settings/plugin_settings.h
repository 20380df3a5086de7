#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "settings/configuration.h"

namespace fotomill {

// What plug-ins get of the settings: the key table, whose values modules may read and change, and
// the user's switches. The configuration file's section "Plugins" holds a line "NAME=0" for each
// module that is switched off. All of this belongs to the main thread, like the configuration.
inline constexpr std::string_view kPluginSection = "Plugins";

// Hands the key table and the switches of the loaded configuration to the plug-in table.
void ApplyPluginSettings();
// Switches a module, by its file name, and saves that. What is loaded stays loaded until the next
// scan.
SaveResult SwitchPluginModule(const std::string& name, bool on);
// Calls the own settings dialog of a row of the plug-in table, and remembers the row in
// PluginConfigIndex. False when the module offers none.
bool ConfigurePluginRow(int32_t index);

}  // namespace fotomill
