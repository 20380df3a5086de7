#pragma once

#include <string>

namespace fotomill::desktop {

// The language that the user chose for the windows, in the section "Desktop" of the configuration
// file. Empty: the language of the system.
std::string StoredLanguage();
// Stores it; false if it could not be written. It takes effect at the next start.
bool StoreLanguage(const std::string& code);

}  // namespace fotomill::desktop
