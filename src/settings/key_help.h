#pragma once

#include <string>
#include <string_view>

#include "settings/key_table.h"

namespace fotomill {

// What keys do, from docs/user/settings.md, in English. That page has an entry for every key that
// this build reads and for no other.

// The page itself.
extern const std::string_view kSettingsPage;

// What the key does, as one paragraph of plain text; empty for a key that this build does not use.
std::string KeyHelp(const KeyRow& row);
// The first sentence of it.
std::string KeySummary(const KeyRow& row);
// Whether anything reads the key.
bool IsKeyUsed(const KeyRow& row);
// What to tell who sets a key that nothing reads, in the user's language.
std::string UnusedKeyText(const KeyRow& row);

}  // namespace fotomill
