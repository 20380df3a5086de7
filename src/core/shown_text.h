#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// Texts and names from files may hold anything; these make them fit to be shown.

// Control characters (below 0x20, 0x7F, U+0080 to U+009F) and bytes that are not UTF-8 written as
// \n, \t, \r or \xNN, so that no text can steer a terminal or break a line. Everything else stays.
std::string EscapeControls(std::string_view text);

}  // namespace fotomill
