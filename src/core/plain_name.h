#pragma once

#include <string_view>

namespace fotomill {

// Whether a text is safe as a file name or part of one: no "/", "\", "..", NUL or control
// character, and on Windows no ":". An empty text is safe.
bool IsPlainName(std::string_view text);

}  // namespace fotomill
