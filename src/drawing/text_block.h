#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "core/status.h"
#include "drawing/text_font.h"

namespace fotomill {

// Where lines of different lengths stand in a block.
enum class TextAlign : int32_t { Left, Center, Right };

// How a text is set. All lengths are in pixels.
struct TextLayout {
  double width = 0;        // lines are broken to be no wider; 0: only where the text says so
  double spacing = 0;      // added behind each character
  double lineSpacing = 0;  // added between lines
  TextAlign align = TextAlign::Center;
};

// Lines of text, set with one font.
struct TextBlock {
  std::vector<TextLine> lines;
  double width = 0, height = 0;  // pixels
  double ascent = 0;             // of the first line
  double step = 0;               // from baseline to baseline
  TextAlign align = TextAlign::Center;
};

// Sets a text, whose lines end with line feeds. Lines that are too wide are broken at blanks and
// between Chinese, Japanese and Korean characters, words that are too wide anywhere. A line has one
// character at least.
TextBlock LayOutText(TextFont& font, std::string_view text, const TextLayout& layout);

// Draws a block with its center at (x, y) of a mask, turned about it by `angle` degrees clockwise;
// `stroke` as in LinePlace. MemoryAllocationError.
Status DrawTextBlock(const TextFont& font, const TextBlock& block, const LinePlace& center,
                     PackedImage& mask);

}  // namespace fotomill
