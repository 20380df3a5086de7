#pragma once

#include <cstdint>

#include "core/fixed_text.h"

namespace fotomill {

// The variable type of each kind of key in settings.def. Colors are 0x00BBGGRR. What the numbers of
// a choice mean is in choice_lists.h.
using SettingFlag = int32_t;       // 0 or 1
using SettingLooseFlag = int32_t;  // a flag whose number is kept as it is
using SettingSetupFlag = int32_t;  // a flag that windows must follow at once
using SettingInteger = int32_t;
using SettingSpin = int32_t;  // an integer with a range in its Setup dialog
using SettingSetupSpin = int32_t;
using SettingColor = int32_t;
using SettingChoice = int32_t;       // position in the choice list
using SettingValueChoice = int32_t;  // value of the list's entry
using SettingInternalInteger = int32_t;
using SettingText = FixedText<260>;
using SettingSetupText = FixedText<260>;
using SettingName = FixedText<260>;  // goes into file names: a name, never a path
using SettingInternalText = FixedText<260>;
using SettingStatusText = FixedText<260>;
using SettingDestination = FixedText<260>;  // extension of a format that can write
using SettingPrefix = FixedText<32>;        // a name as well

// Every configuration key as a variable of its own name, at its built-in default until a
// configuration file is loaded.
struct Settings {
#define SETTING(kind, key, control, extra, value) Setting##kind key{value};
#include "settings/settings.def"
#undef SETTING
};

// The settings in force. Codecs and processing only read them; they change between jobs, never
// during one.
extern Settings settings;
// The built-in defaults.
extern const Settings defaultSettings;

}  // namespace fotomill
