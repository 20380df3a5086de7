#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "core/shown_text.h"

namespace fotomill::cli {

// The standard alphabet with padding (RFC 4648, section 4).
std::string Base64(std::string_view bytes);

// A paragraph in lines of at most `width` characters, parted at blanks; a longer word is a line of
// its own.
std::vector<std::string> WrappedLines(std::string_view text, size_t width);

}  // namespace fotomill::cli
