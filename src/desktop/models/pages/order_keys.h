#pragma once

#include <string>
#include <string_view>

namespace fotomill::desktop {

// The keys behind options of pages. Kind "": options of all kinds.

// The value in the settings; empty: the default, or no key stands for the option.
std::string LoadOption(std::string_view kind, std::string_view option);
// Stores a value; a value that its key cannot hold is not stored.
void StoreOption(std::string_view kind, std::string_view option, const std::string& value);

}  // namespace fotomill::desktop
