#pragma once

#include <string>
#include <string_view>

#include "settings/key_table.h"

namespace fotomill {

// Help for keys, from docs/user/settings.md, in English. That page documents exactly the keys that
// this build uses.

// The whole page.
extern const std::string_view kSettingsPage;

// A key's description as one paragraph of plain text; empty for a key that this build does not use.
std::string KeyHelp(const KeyRow& row);
// The first sentence of KeyHelp.
std::string KeySummary(const KeyRow& row);
// Whether this build uses the key.
bool IsKeyUsed(const KeyRow& row);
// The warning for setting an unused key, in the user's language.
std::string UnusedKeyText(const KeyRow& row);

}  // namespace fotomill
