#pragma once

#include <cstdint>
#include <string_view>

#include "settings/configuration.h"

namespace fotomill {

// The user's format switches, stored in the section "Formats" of
// the configuration file: a line "EXTENSION=0" or "EXTENSION=1"
// for each row whose switch differs from its default.
inline constexpr std::string_view kFormatSection = "Formats";

// Sets every row's switch from the loaded configuration, or to its default, and applies the plug-in
// override. Lines for unknown rows are ignored.
void TakeFormatSwitches();
// Passes AllowPluginFormatOverride to the registry.
// To be called when the settings have changed.
void TakePluginOverride();
// Switches a row on or off and saves that. The switch changes even if saving fails.
SaveResult SwitchFormat(int32_t index, bool on);

}  // namespace fotomill
