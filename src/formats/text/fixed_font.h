#pragma once

#include <array>
#include <cstdint>

namespace fotomill {

// A font of one size for text that has to look the same everywhere: "misc-fixed 8x13" of the X
// Window System (Debian package xfonts-base), which is in the public domain. It has Latin, Greek
// and Cyrillic letters and the characters of boxes.
inline constexpr int32_t kGlyphWidth = 8, kGlyphHeight = 13;  // pixels

// Rows from the top; the highest bit is at the left, set bits are ink.
using GlyphRows = std::array<uint8_t, kGlyphHeight>;

// The glyph of a code point, that of U+FFFD when the font has none.
const GlyphRows& GlyphOf(char32_t codePoint);

}  // namespace fotomill
