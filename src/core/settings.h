#pragma once

#include <cstdint>

#include "core/fixed_text.h"

namespace fotomill {

// The variable type of each kind of key in settings.def.
using SettingFlag = int32_t;
using SettingInteger = int32_t;
using SettingSpin = int32_t;
using SettingSetupSpin = int32_t;
using SettingColour = int32_t;
using SettingChoice = int32_t;
using SettingValueChoice = int32_t;
using SettingInternalInteger = int32_t;
using SettingText = FixedText<260>;
using SettingInternalText = FixedText<260>;
using SettingStatusText = FixedText<260>;
using SettingDestination = FixedText<260>;
using SettingPrefix = FixedText<32>;

// Every configuration key as a variable of its own name, at its built-in default until a configuration file is loaded.
struct Settings {
#define SETTING(kind, key, value) Setting##kind key{value};
#include "core/settings.def"
#undef SETTING
};

// The settings in force. Codecs and processing only read them; they change between jobs, never during one.
extern Settings settings;

}  // namespace fotomill
