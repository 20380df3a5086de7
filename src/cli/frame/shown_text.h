#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "core/shown_text.h"

namespace fotomill::cli {

// Base64 with padding (RFC 4648, section 4).
std::string Base64(std::string_view bytes);

// Wraps a paragraph at blanks to at most `width` characters per line; longer words get a line of
// their own.
std::vector<std::string> WrappedLines(std::string_view text, size_t width);

}  // namespace fotomill::cli
