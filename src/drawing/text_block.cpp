#include "drawing/text_block.h"

#include <algorithm>
#include <cmath>
#include <numbers>
#include <string>

#include "core/utf8.h"

namespace fotomill {

namespace {

constexpr char32_t kUnknown = 0xFFFD;
constexpr double kFraction = 64;

// Whether a line may be broken before and after a non-blank character.
bool IsIdeograph(char32_t c) {
  return (c >= 0x2E80 && c <= 0x9FFF) || (c >= 0xAC00 && c <= 0xD7A3) ||
         (c >= 0xF900 && c <= 0xFAFF) || (c >= 0xFF01 && c <= 0xFF60) ||
         (c >= 0x20000 && c <= 0x3FFFF);
}

std::string_view WithoutBlanksBehind(std::string_view text) {
  while (text.ends_with(' ')) text.remove_suffix(1);
  return text;
}

// The bytes up to the next line break opportunity: a word with the blanks after it,
// or an ideograph.
size_t PieceLength(std::string_view text) {
  std::string_view rest = text;
  bool blank = false;
  while (!rest.empty()) {
    std::string_view behind = rest;
    const char32_t c = NextCharacter(behind, kUnknown);
    const bool first = rest.size() == text.size();
    if (c != ' ' && (blank || (!first && IsIdeograph(c)))) break;
    blank = blank || c == ' ';
    rest = behind;
    if (IsIdeograph(c) && !rest.starts_with(' ')) break;
  }
  return text.size() - rest.size();
}

class Breaker {
 public:
  Breaker(TextFont& font, const TextLayout& layout) : font_(font), layout_(layout) {}

  void Add(std::string_view line) {
    if (line.empty()) return Put(line);
    size_t taken = 0;
    while (taken < line.size()) {
      const size_t more = PieceLength(line.substr(taken));
      if (Fits(line.substr(0, taken + more))) {
        taken += more;
        continue;
      }
      if (taken == 0) taken = LongestStart(line.substr(0, more));
      Put(WithoutBlanksBehind(line.substr(0, taken)));
      line.remove_prefix(taken);
      taken = 0;
    }
    if (!line.empty()) Put(line);
  }
  std::vector<TextLine> Take() { return std::move(lines_); }

 private:
  bool Fits(std::string_view text) {
    if (layout_.width <= 0) return true;
    const TextLine line = font_.Shape(WithoutBlanksBehind(text), layout_.spacing);
    return line.width <= layout_.width * kFraction;
  }
  // As many characters as fit, at least one.
  size_t LongestStart(std::string_view word) {
    size_t length = 0;
    for (std::string_view rest = word; !rest.empty();) {
      (void)NextCharacter(rest, kUnknown);
      if (length > 0 && !Fits(word.substr(0, word.size() - rest.size()))) break;
      length = word.size() - rest.size();
    }
    return length;
  }
  void Put(std::string_view line) { lines_.push_back(font_.Shape(line, layout_.spacing)); }

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
                     PackedImage& mask) {
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
    RETURN_IF_BAD(font.Draw(block.lines[i], place, mask));
  }
  return Status::Ok;
}

}  // namespace fotomill
