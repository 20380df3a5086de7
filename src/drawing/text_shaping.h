#pragma once

#include <string_view>

#include "drawing/font_faces.h"
#include "drawing/text_line.h"

namespace fotomill {

// Size of the box for a missing character, relative to the em: its advance, width, and height above
// the baseline.
inline constexpr double kBoxAdvance = 0.6, kBoxWidth = 0.5, kBoxHeight = 0.7;

// Decodes UTF-8 and resolves embedding levels (Unicode Standard Annex 9; the paragraph's direction
// is that of its first letter). Control characters and invalid UTF-8 become U+FFFD, tabs spaces.
TextParagraph ReadParagraph(std::string_view text);

// Shapes `count` characters of a paragraph from `start` on as a line: chooses a font for each
// character with its marks, reorders right-to-left runs, and positions glyphs with the font's
// ligatures and marks. `spacing` pixels are added after each character; it may be negative.
TextLine ShapeLine(FontFaces& fonts, const TextParagraph& paragraph, size_t start, size_t count,
                   double spacing = 0);

}  // namespace fotomill
