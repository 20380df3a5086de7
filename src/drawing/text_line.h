#pragma once

#include <cstdint>
#include <vector>

namespace fotomill {

// A glyph of a line of text, or the box that stands for a character that no font has.
struct PlacedGlyph {
  static constexpr int32_t kBox = -1;
  int32_t face = 0;      // of the fonts, or kBox
  uint32_t glyph = 0;    // its number in that font
  int32_t x = 0, y = 0;  // its origin from the start of the baseline: 64ths of a pixel, y upward
};

// A line of text, its glyphs in the order in which they stand from left to right.
struct TextLine {
  std::vector<PlacedGlyph> glyphs;
  int32_t width = 0;  // 64ths of a pixel
};

// Where and how a line is drawn.
struct LinePlace {
  double x = 0, y = 0;  // the start of the baseline, in pixels from the mask's top left corner
  double angle = 0;     // of the baseline about that point: degrees, clockwise
  // 0: the letters; else a band along their edges, so many pixels to each side
  double stroke = 0;
};

}  // namespace fotomill
