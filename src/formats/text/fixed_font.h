#pragma once

#include <array>
#include <cstdint>

namespace fotomill {

// A fixed-size font, for text that must look the same everywhere: "misc-fixed 8x13" of the X Window
// System (Debian package xfonts-base), which is in the public domain. Has Latin, Greek and Cyrillic
// letters and box-drawing characters.
inline constexpr int32_t kGlyphWidth = 8, kGlyphHeight = 13;  // pixels

// Top row first; the highest bit is the leftmost pixel, set bits are ink.
using GlyphRows = std::array<uint8_t, kGlyphHeight>;

// The glyph for a code point, or that of U+FFFD if there is none.
const GlyphRows& GlyphOf(char32_t codePoint);

}  // namespace fotomill
