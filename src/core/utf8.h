#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace fotomill {

// UTF-8 texts (RFC 3629; Unicode, table 3-7): no overlong forms, no surrogates, nothing beyond
// U+10FFFF. Texts from files may contain anything, so every function documents how it treats
// invalid bytes.

// Length in bytes, 1 to 4, of the well-formed character at the start of `text`; 0 if it is
// malformed or the text is empty.
size_t CharacterLength(std::string_view text);

// Whether a text is entirely valid UTF-8.
bool IsUtf8(std::string_view text);

// Removes the first character from `text` and returns its code point. An invalid byte is removed
// alone and returns `unknown`. The text must not be empty.
char32_t NextCharacter(std::string_view& text, char32_t unknown);

// The number of characters in `text`; continuation bytes are not counted.
size_t CharacterCount(std::string_view text);

// The first `limit` bytes of `text`, without splitting a character at the end. Invalid bytes may be
// cut anywhere.
std::string_view CutText(std::string_view text, size_t limit);

}  // namespace fotomill
