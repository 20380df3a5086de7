#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "plugins/module_facts.h"
#include "settings/configuration.h"

namespace fotomill {

// Settings for plug-ins: the key table, which modules can access, and the user's module switches,
// stored in the section "Plugins" of the configuration file: a line "NAME=0" for each module that
// is off, and a line "NAME.OPTION=NUMBER" for each option that is not at its standard value. For
// the main thread only, like the configuration.
inline constexpr std::string_view kPluginSection = "Plugins";

// Passes the key table and the loaded switches to the plug-in table.
void ApplyPluginSettings();
// Switches a module, by file name, on or off and saves that. Loaded modules stay loaded until the
// next scan.
SaveResult SwitchPluginModule(const std::string& name, bool on);
// Stores the values of a module's options, those that are not the standard ones. `values` are in
// the order of `options`.
SaveResult StorePluginOptions(const std::string& name, const std::vector<ModuleOption>& options,
                              const std::vector<int32_t>& values);
// Opens the settings dialog of a plug-in table row, and stores the row in PluginConfigIndex. False
// if the module has none.
bool ConfigurePluginRow(int32_t index);

}  // namespace fotomill
