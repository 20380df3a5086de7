#pragma once

#include <cstdint>

#include "core/fixed_text.h"

namespace fotomill {

// The C++ type for each kind of key in settings.def. Colors are 0x00BBGGRR. The numbers of choices
// are in choice_lists.h.
using SettingFlag = int32_t;       // 0 or 1
using SettingLooseFlag = int32_t;  // a flag that keeps any number
using SettingSetupFlag = int32_t;  // a flag that windows apply at once
using SettingInteger = int32_t;
using SettingSpin = int32_t;  // an integer with a range in Setup
using SettingSetupSpin = int32_t;
using SettingColor = int32_t;
using SettingChoice = int32_t;       // index into the choice list
using SettingValueChoice = int32_t;  // value of the choice list's entry
using SettingInternalInteger = int32_t;
using SettingText = FixedText<260>;
using SettingSetupText = FixedText<260>;
using SettingName = FixedText<260>;  // used in file names: a name, never a path
using SettingInternalText = FixedText<260>;
using SettingStatusText = FixedText<260>;
using SettingDestination = FixedText<260>;  // extension of a writable format
using SettingPrefix = FixedText<32>;        // also used in file names

// Every configuration key as a variable of the same name, with its default until the configuration
// file is loaded.
struct Settings {
#define SETTING(kind, key, control, extra, value) Setting##kind key{value};
#include "settings/settings.def"
#undef SETTING
};

// The current settings. Codecs and processing only read them; they change between jobs, never
// during one.
extern Settings settings;
// The built-in defaults.
extern const Settings defaultSettings;

}  // namespace fotomill
