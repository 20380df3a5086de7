#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// Texts and names from files may contain anything; these make them safe to display.

// Escapes control characters (below 0x20, 0x7F, U+0080 to U+009F) and invalid UTF-8 as \n, \t, \r
// or \xNN, so that no text can send terminal escapes or break a line.
std::string EscapeControls(std::string_view text);

}  // namespace fotomill
