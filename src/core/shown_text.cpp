#include "core/shown_text.h"

#include <algorithm>
#include <cstdint>

#include "core/utf8.h"

namespace fotomill {

namespace {

uint8_t ByteAt(std::string_view text, size_t place) { return static_cast<uint8_t>(text[place]); }

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
  if (std::all_of(text.begin(), text.end(), [](char c) { return c >= 0x20 && c < 0x7F; }))
    return std::string(text);
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

}  // namespace fotomill
