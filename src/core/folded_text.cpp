#include "core/folded_text.h"

#include "core/natural_order.h"
#include "core/text.h"
#include "core/utf8.h"

namespace fotomill {

namespace {

// Capital letters `first` to `last`; the small ones are `distance` further. With distance 1,
// capital and small letters alternate.
struct CaseRange {
  char32_t first, last;
  int32_t distance;
};
// clang-format off
constexpr CaseRange kCaseRanges[] = {
    {0x00c0, 0x00d6, 32}, {0x00d8, 0x00de, 32},                        // Latin-1
    {0x0100, 0x012f, 1},  {0x0132, 0x0137, 1},  {0x014a, 0x0177, 1},   // Latin Extended-A
    {0x0139, 0x0147, 1},  {0x0178, 0x0178, -121}, {0x0179, 0x017d, 1},
    {0x0386, 0x0386, 38}, {0x0388, 0x038a, 37}, {0x038c, 0x038c, 64},  // Greek
    {0x038e, 0x038f, 63}, {0x0391, 0x03ab, 32},
    {0x0400, 0x040f, 80}, {0x0410, 0x042f, 32}, {0x0460, 0x0481, 1},   // Cyrillic
    {0x048a, 0x04bf, 1},  {0x04d0, 0x052f, 1},
    {0x0531, 0x0556, 48},                                              // Armenian
    {0x1e00, 0x1e95, 1},  {0x1ea0, 0x1eff, 1},                         // Latin Extended Additional
};
// clang-format on

char32_t Folded(char32_t letter) {
  for (const CaseRange& range : kCaseRanges) {
    if (letter < range.first || letter > range.last) continue;
    const bool capital = range.distance != 1 || (letter - range.first) % 2 == 0;
    return capital ? static_cast<char32_t>(static_cast<int32_t>(letter) + range.distance) : letter;
  }
  return letter;
}

// All letters of the table are in this range.
void AppendTwoOrThree(char32_t letter, std::string& text) {
  if (letter < 0x800) {
    text += static_cast<char>(0xc0 | letter >> 6);
  } else {
    text += static_cast<char>(0xe0 | letter >> 12);
    text += static_cast<char>(0x80 | (letter >> 6 & 0x3f));
  }
  text += static_cast<char>(0x80 | (letter & 0x3f));
}

}  // namespace

std::string FoldCase(std::string_view text) {
  std::string folded;
  folded.reserve(text.size());
  while (!text.empty()) {
    const size_t length = CharacterLength(text);
    if (length < 2) {  // ASCII, or an invalid byte
      folded += LowerCase(text.front());
      text.remove_prefix(1);
      continue;
    }
    std::string_view rest = text;
    const char32_t letter = NextCharacter(rest, 0), small = Folded(letter);
    if (small == letter) {
      folded += text.substr(0, length);
    } else {
      AppendTwoOrThree(small, folded);
    }
    text = rest;
  }
  return folded;
}

bool ContainsText(std::string_view text, std::string_view part) {
  return FoldCase(text).find(FoldCase(part)) != std::string::npos;
}

bool IsTextLike(std::string_view text, std::string_view pattern) {
  if (pattern.find_first_of("*?") == std::string_view::npos)
    return FoldCase(text) == FoldCase(pattern);
  return MatchesFilter(FoldCase(text), FoldCase(pattern));
}

}  // namespace fotomill
