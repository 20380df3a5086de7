#pragma once

#include <cstdint>
#include <string_view>

#include "settings/configuration.h"

namespace fotomill {

// The user's switches of the format rows between runs: the section "Formats" of the configuration
// file holds a line "EXTENSION=0" or "EXTENSION=1" for each row whose switch is not as the program
// has it by default.
inline constexpr std::string_view kFormatSection = "Formats";

// Gives every row the switch that the loaded configuration says, or its default, and takes the
// plug-ins' override. Lines that name no row mean nothing.
void TakeFormatSwitches();
// The part of it that is a key: tells the registry of AllowPluginFormatOverride. To be called when
// the settings have changed.
void TakePluginOverride();
// Switches a row on or off and saves that. The switch is turned even if saving fails.
SaveResult SwitchFormat(int32_t index, bool on);

}  // namespace fotomill
