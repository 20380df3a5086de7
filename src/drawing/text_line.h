#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace fotomill {

// Alignment of lines of text.
enum class TextAlign : int32_t { Left, Center, Right };

// A glyph in a line of text, or a box for a character without a glyph.
struct PlacedGlyph {
  static constexpr int32_t kBox = -1;
  int32_t face = 0;      // index of the font, or kBox
  uint32_t glyph = 0;    // glyph index in that font
  int32_t x = 0, y = 0;  // origin relative to the start of the baseline: 64ths of a pixel, y upward
  // the first character of the paragraph that it belongs to; glyphs of a cluster share it
  uint32_t character = 0;
};

// A line of text, with its glyphs in visual order from left to right.
struct TextLine {
  std::vector<PlacedGlyph> glyphs;
  int32_t width = 0;  // 64ths of a pixel
};

// A text without line feeds, to be shaped in one or more lines, which all have its direction.
struct TextParagraph {
  std::u32string characters;   // controls and invalid UTF-8 are U+FFFD, tabs are spaces
  std::vector<int8_t> levels;  // embedding level of each character; odd: right to left
};

// Position and style of a line.
struct LinePlace {
  double x = 0, y = 0;  // the start of the baseline, in pixels from the mask's top left corner
  double angle = 0;     // rotation about that point: degrees, clockwise
  // 0: filled letters; else their outline, this many pixels to each side of the edge
  double stroke = 0;
};

}  // namespace fotomill
