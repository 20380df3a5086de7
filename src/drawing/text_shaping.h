#pragma once

#include <string_view>

#include "drawing/font_faces.h"
#include "drawing/text_line.h"

namespace fotomill {

// The size of the box for a missing character, in parts of an em: its advance, and its own width
// and height above the baseline.
inline constexpr double kBoxAdvance = 0.6, kBoxWidth = 0.5, kBoxHeight = 0.7;

// Shapes a line of UTF-8: chooses a font for each character with its marks, orders what runs from
// right to left (Unicode Standard Annex 9; the direction of the line is that of its first letter),
// and joins, stacks and places glyphs as the fonts say. Control characters and bytes that are no
// UTF-8 become U+FFFD, tabs spaces. `spacing` pixels are added behind each character; it may be
// negative.
TextLine ShapeLine(FontFaces& fonts, std::string_view text, double spacing = 0);

}  // namespace fotomill
