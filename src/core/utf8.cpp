#include "core/utf8.h"

#include <algorithm>

namespace fotomill {

namespace {

constexpr size_t kLongest = 4;  // bytes of a character

uint8_t ByteAt(std::string_view text, size_t place) { return static_cast<uint8_t>(text[place]); }

bool Continues(uint8_t byte) { return (byte & 0xC0) == 0x80; }

}  // namespace

size_t CharacterLength(std::string_view text) {
  if (text.empty()) return 0;
  const uint8_t first = ByteAt(text, 0);
  if (first < 0x80) return 1;
  size_t length = 0;
  // of the second byte: rules out overlong forms, surrogates and values beyond U+10FFFF
  uint8_t lowest = 0x80, highest = 0xBF;
  if (first >= 0xC2 && first <= 0xDF) {
    length = 2;
  } else if (first >= 0xE0 && first <= 0xEF) {
    length = 3;
    if (first == 0xE0) lowest = 0xA0;
    if (first == 0xED) highest = 0x9F;
  } else if (first >= 0xF0 && first <= 0xF4) {
    length = 4;
    if (first == 0xF0) lowest = 0x90;
    if (first == 0xF4) highest = 0x8F;
  }
  if (length == 0 || text.size() < length) return 0;
  if (ByteAt(text, 1) < lowest || ByteAt(text, 1) > highest) return 0;
  for (size_t i = 2; i < length; ++i) {
    if (!Continues(ByteAt(text, i))) return 0;
  }
  return length;
}

bool IsUtf8(std::string_view text) {
  while (!text.empty()) {
    const size_t length = CharacterLength(text);
    if (length == 0) return false;
    text.remove_prefix(length);
  }
  return true;
}

char32_t NextCharacter(std::string_view& text, char32_t unknown) {
  const size_t length = CharacterLength(text);
  if (length == 0) {
    text.remove_prefix(1);
    return unknown;
  }
  const uint8_t first = ByteAt(text, 0);
  char32_t value = length == 1 ? first : first & (0xFFu >> (length + 1));
  for (size_t i = 1; i < length; ++i) value = value << 6 | (ByteAt(text, i) & 0x3Fu);
  text.remove_prefix(length);
  return value;
}

size_t CharacterCount(std::string_view text) {
  return static_cast<size_t>(std::count_if(
      text.begin(), text.end(), [](char c) { return !Continues(static_cast<uint8_t>(c)); }));
}

std::string_view CutText(std::string_view text, size_t limit) {
  if (text.size() <= limit) return text;
  for (size_t start = limit; start > 0 && limit - start < kLongest - 1;) {
    --start;
    if (Continues(ByteAt(text, start))) continue;
    const bool cut = start + CharacterLength(text.substr(start)) > limit;
    return text.substr(0, cut ? start : limit);
  }
  return text.substr(0, limit);
}

}  // namespace fotomill
