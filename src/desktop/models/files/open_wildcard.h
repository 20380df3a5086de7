#pragma once

#include <string>

namespace fotomill::desktop {

// The filter for open-file dialogs: descriptions and patterns, separated by "|". Patterns match
// extensions in uppercase and lowercase.
std::string OpenWildcard();
// The place of the filter that a dialog begins with: OpenFilterIndex, or the first one if there are
// fewer filters now.
int FirstOpenFilter();

}  // namespace fotomill::desktop
