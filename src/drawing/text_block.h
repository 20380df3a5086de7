#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "core/status.h"
#include "drawing/text_font.h"

namespace fotomill {

// Layout of a text. All lengths are in pixels.
struct TextLayout {
  double width = 0;        // maximum line width; 0: break only at line feeds
  double spacing = 0;      // added after each character
  double lineSpacing = 0;  // added between lines
  TextAlign align = TextAlign::Center;
};

// Lines of text in one font.
struct TextBlock {
  std::vector<TextLine> lines;
  double width = 0, height = 0;  // pixels
  double ascent = 0;             // of the first line
  double step = 0;               // from baseline to baseline
  TextAlign align = TextAlign::Center;
};

// Lays out a text with line feeds as line separators. Lines that are too wide are broken at blanks
// and between Chinese, Japanese and Korean characters, and words that are too wide anywhere. A line
// has at least one character.
TextBlock LayOutText(TextFont& font, std::string_view text, const TextLayout& layout);

// Draws a block centered at (x, y) of a mask, rotated about that point by `angle` degrees
// clockwise; `stroke` as in LinePlace. Statuses as DrawLine.
Status DrawTextBlock(const TextFont& font, const TextBlock& block, const LinePlace& center,
                     PackedImage& mask, const Work& work = {});

}  // namespace fotomill
