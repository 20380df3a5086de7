#pragma once

#include <string>

namespace fotomill::desktop {

// The open-file filter as file dialogs take it: descriptions and patterns, divided by "|". Patterns
// match extensions in upper and in lower case.
std::string OpenWildcard();

}  // namespace fotomill::desktop
