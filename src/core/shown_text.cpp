#include "core/shown_text.h"

#include <algorithm>
#include <cstdint>

namespace fotomill {

namespace {

uint8_t ByteAt(std::string_view text, size_t place) { return static_cast<uint8_t>(text[place]); }

// Bytes of the well-formed UTF-8 character at the start of `text` (Unicode, table 3-7), 0 if there is none.
size_t CharacterLength(std::string_view text) {
  const uint8_t first = ByteAt(text, 0);
  if (first < 0x80) return 1;
  size_t length = 0;
  uint8_t lowest = 0x80, highest = 0xBF;  // of the second byte: neither too long a form, nor a surrogate, nor too large
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
    if ((ByteAt(text, i) & 0xC0) != 0x80) return 0;
  }
  return length;
}

bool IsControl(std::string_view character) {
  const uint8_t first = ByteAt(character, 0);
  return first < 0x20 || first == 0x7F || (first == 0xC2 && ByteAt(character, 1) < 0xA0);
}

void AppendEscaped(std::string& result, std::string_view bytes) {
  constexpr char kDigits[] = "0123456789ABCDEF";
  if (bytes == "\n" || bytes == "\r" || bytes == "\t") {
    result += bytes == "\n" ? "\\n" : bytes == "\r" ? "\\r" : "\\t";
    return;
  }
  for (const char c : bytes) {
    const auto byte = static_cast<uint8_t>(c);
    result.append("\\x").append(1, kDigits[byte >> 4]).append(1, kDigits[byte & 15]);
  }
}

}  // namespace

std::string EscapeControls(std::string_view text) {
  if (std::all_of(text.begin(), text.end(), [](char c) { return c >= 0x20 && c < 0x7F; })) return std::string(text);
  std::string result;
  result.reserve(text.size());
  while (!text.empty()) {
    const size_t length = CharacterLength(text);
    const std::string_view character = text.substr(0, length == 0 ? 1 : length);
    if (length == 0 || IsControl(character)) {
      AppendEscaped(result, character);
    } else {
      result += character;
    }
    text.remove_prefix(character.size());
  }
  return result;
}

bool IsUtf8(std::string_view text) {
  while (!text.empty()) {
    const size_t length = CharacterLength(text);
    if (length == 0) return false;
    text.remove_prefix(length);
  }
  return true;
}

}  // namespace fotomill
