#include "drawing/text_block.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <string>

#include "drawing/text_shaping.h"

namespace fotomill {

namespace {

constexpr double kFraction = 64;

// Whether a line may be broken before and after this character.
bool IsIdeograph(char32_t c) {
  return (c >= 0x2E80 && c <= 0x9FFF) || (c >= 0xAC00 && c <= 0xD7A3) ||
         (c >= 0xF900 && c <= 0xFAFF) || (c >= 0xFF01 && c <= 0xFF60) ||
         (c >= 0x20000 && c <= 0x3FFFF);
}

// The length of a text without the blanks at its end.
size_t LengthWithoutBlanks(std::u32string_view text) {
  const size_t last = text.find_last_not_of(U' ');
  return last == std::u32string_view::npos ? 0 : last + 1;
}

// Whether a line may be broken before a character: after the blanks that follow a word, and on
// both sides of an ideograph.
bool MayBreak(std::u32string_view text, size_t place) {
  const char32_t before = text[place - 1], behind = text[place];
  return behind != ' ' && (before == ' ' || IsIdeograph(before) || IsIdeograph(behind));
}

// Breaks paragraphs into lines.
class Breaker {
 public:
  Breaker(TextFont& font, const TextLayout& layout) : font_(font), layout_(layout) {}

  void Add(std::string_view text) {
    const TextParagraph paragraph = ReadParagraph(text);
    const size_t end = paragraph.characters.size();
    size_t start = 0;
    do {
      const size_t next = NextBreak(paragraph, start);
      const std::u32string_view line =
          std::u32string_view(paragraph.characters).substr(start, next - start);
      const size_t length = next < end ? LengthWithoutBlanks(line) : line.size();
      lines_.push_back(font_.Shape(paragraph, start, length, layout_.spacing));
      start = next;
    } while (start < end);
  }
  std::vector<TextLine> Take() { return std::move(lines_); }

 private:
  // The end of the line that begins at `start`, blanks included.
  size_t NextBreak(const TextParagraph& paragraph, size_t start) {
    const std::u32string_view text = paragraph.characters;
    const size_t fitting = LongestStart(paragraph, start);
    if (fitting == text.size()) return fitting;
    size_t end = fitting;
    while (end < text.size() && text[end] == ' ') ++end;  // trailing blanks may exceed the width
    for (; end > start; --end) {
      if (end < text.size() && !MayBreak(text, end)) continue;
      if (Fits(paragraph, start, end)) return end;
    }
    return std::max(fitting, start + 1);
  }

  // The end of the longest text that fits, found by doubling and bisection: shaping all of a long
  // paragraph for every line would take quadratic time.
  size_t LongestStart(const TextParagraph& paragraph, size_t start) {
    const size_t left = paragraph.characters.size() - start;
    size_t fits = 0, tried = std::min<size_t>(left, 16);
    while (fits < left && Fits(paragraph, start, start + tried)) {
      fits = tried;
      tried = std::min(2 * tried, left);
    }
    for (size_t beyond = tried; fits + 1 < beyond;) {
      const size_t middle = (fits + beyond) / 2;
      (Fits(paragraph, start, start + middle) ? fits : beyond) = middle;
    }
    return start + fits;
  }

  bool Fits(const TextParagraph& paragraph, size_t start, size_t end) {
    if (layout_.width <= 0) return true;
    const auto text = std::u32string_view(paragraph.characters).substr(start, end - start);
    const TextLine line = font_.Shape(paragraph, start, LengthWithoutBlanks(text), layout_.spacing);
    return line.width <= layout_.width * kFraction;
  }

  TextFont& font_;
  const TextLayout& layout_;
  std::vector<TextLine> lines_;
};

}  // namespace

TextBlock LayOutText(TextFont& font, std::string_view text, const TextLayout& layout) {
  Breaker breaker(font, layout);
  for (;;) {
    const size_t end = text.find('\n');
    breaker.Add(text.substr(0, end));
    if (end == std::string_view::npos) break;
    text.remove_prefix(end + 1);
  }
  TextBlock block{.lines = breaker.Take(), .ascent = font.Ascent(), .align = layout.align};
  block.step = std::max(std::round(font.LineHeight()) + layout.lineSpacing, 1.0);
  const auto gaps = static_cast<double>(block.lines.size() - 1);
  block.height = std::ceil(font.LineHeight()) + gaps * block.step;
  for (const TextLine& line : block.lines)
    block.width = std::max(block.width, std::ceil(line.width / kFraction));
  return block;
}

Status DrawTextBlock(const TextFont& font, const TextBlock& block, const LinePlace& center,
                     PackedImage& mask, const Work& work) {
  const double radians = center.angle * std::numbers::pi / 180, cosine = std::cos(radians),
               sine = std::sin(radians);
  const double left = -block.width / 2, top = -block.height / 2;
  for (size_t i = 0; i < block.lines.size(); ++i) {
    const double room = block.width - block.lines[i].width / kFraction;
    const double across = left + (block.align == TextAlign::Left     ? 0
                                  : block.align == TextAlign::Center ? room / 2
                                                                     : room);
    const double down = top + block.ascent + static_cast<double>(i) * block.step;
    LinePlace place = center;
    place.x = center.x + across * cosine - down * sine;
    place.y = center.y + across * sine + down * cosine;
    if (center.angle == 0) place.y = std::round(place.y);
    RETURN_IF_BAD(font.Draw(block.lines[i], place, mask, work));
  }
  return Status::Ok;
}

}  // namespace fotomill
