#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace fotomill {

// Texts in UTF-8 (RFC 3629; Unicode, table 3-7): no overlong forms, no surrogates, nothing beyond
// U+10FFFF. Texts from files may hold anything else, so every function says what it does with bytes
// that are no UTF-8.

// Bytes of the well-formed character at the start of `text`, 1 to 4; 0 if there is none or the text
// is empty.
size_t CharacterLength(std::string_view text);

// Whether a text is well-formed from end to end.
bool IsUtf8(std::string_view text);

// Cuts the first character off `text` and returns its code point. A byte that begins none is cut
// off alone and gives `unknown`. The text must not be empty.
char32_t NextCharacter(std::string_view& text, char32_t unknown);

// The number of characters in `text`; bytes that only continue one do not count.
size_t CharacterCount(std::string_view text);

// The first `limit` bytes of `text`, less the beginning of a character that would be cut. Bytes
// that belong to no character are cut anywhere.
std::string_view CutText(std::string_view text, size_t limit);

}  // namespace fotomill
