#pragma once

#include <string>

namespace fotomill::desktop {

// The filter for open-file dialogs: descriptions and patterns, separated by "|". Patterns match
// extensions in uppercase and lowercase.
std::string OpenWildcard();

}  // namespace fotomill::desktop
