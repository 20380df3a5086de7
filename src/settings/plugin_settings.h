#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "settings/configuration.h"

namespace fotomill {

// Settings for plug-ins: the key table, which modules can access, and the user's module switches,
// stored in the section "Plugins" of the configuration file: a line "NAME=0" for each module that
// is off. For the main thread only, like the configuration.
inline constexpr std::string_view kPluginSection = "Plugins";

// Passes the key table and the loaded switches to the plug-in table.
void ApplyPluginSettings();
// Switches a module, by file name, on or off and saves that. Loaded modules stay loaded until the
// next scan.
SaveResult SwitchPluginModule(const std::string& name, bool on);
// Opens the settings dialog of a plug-in table row, and stores the row in PluginConfigIndex. False
// if the module has none.
bool ConfigurePluginRow(int32_t index);

}  // namespace fotomill
