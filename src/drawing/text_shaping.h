#pragma once

#include <string_view>

#include "drawing/font_faces.h"
#include "drawing/text_line.h"

namespace fotomill {

// Size of the box for a missing character, relative to the em: its advance, width, and height above
// the baseline.
inline constexpr double kBoxAdvance = 0.6, kBoxWidth = 0.5, kBoxHeight = 0.7;

// Shapes a line of UTF-8: chooses a font for each character with its marks,
// reorders right-to-left runs (Unicode Standard Annex 9; the line's direction
// is that of its first letter), and positions glyphs with the font's ligatures
// and marks. Control characters and invalid UTF-8 become U+FFFD, tabs become
// spaces. `spacing` pixels are added after each character; it may be negative.
TextLine ShapeLine(FontFaces& fonts, std::string_view text, double spacing = 0);

}  // namespace fotomill
