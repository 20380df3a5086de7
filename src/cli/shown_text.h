#pragma once

#include <string>
#include <string_view>

namespace fotomill::cli {

// Texts and names may hold anything; these make them fit for where they go.

// Control characters (below 0x20, 0x7F, U+0080 to U+009F) and bytes that are not UTF-8 written as \n, \t, \r or \xNN,
// so that no name can steer a terminal. Everything else stays.
std::string EscapeControls(std::string_view text);

bool IsUtf8(std::string_view text);

// The standard alphabet with padding (RFC 4648, section 4).
std::string Base64(std::string_view bytes);

}  // namespace fotomill::cli
