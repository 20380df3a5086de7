#pragma once

#include <string>

namespace fotomill::desktop {

// The user's language for the windows, from the section "Desktop" of the configuration file. Empty:
// system language.
std::string StoredLanguage();
// Stores it; false if it cannot be written. Takes effect at the next start.
bool StoreLanguage(const std::string& code);

}  // namespace fotomill::desktop
