#include "cli/frame/shown_text.h"

#include <algorithm>
#include <cstdint>

#include "core/utf8.h"

namespace fotomill::cli {

std::string Base64(std::string_view bytes) {
  constexpr char kAlphabet[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  std::string result;
  for (size_t i = 0; i < bytes.size(); i += 3) {
    const size_t count = bytes.size() - i < 3 ? bytes.size() - i : 3;
    uint32_t group = 0;
    for (size_t k = 0; k < 3; ++k)
      group = group << 8 | (k < count ? static_cast<uint8_t>(bytes[i + k]) : 0u);
    for (size_t k = 0; k < 4; ++k)
      result += k <= count ? kAlphabet[group >> (18 - 6 * k) & 63] : '=';
  }
  return result;
}

std::vector<std::string> WrappedLines(std::string_view text, size_t width) {
  std::vector<std::string> lines;
  size_t used = 0;
  while (!text.empty()) {
    const std::string_view word = text.substr(0, text.find(' '));
    text.remove_prefix(std::min(word.size() + 1, text.size()));
    const size_t length = CharacterCount(word);
    if (lines.empty() || used + 1 + length > width) {
      lines.emplace_back(word);
      used = length;
    } else {
      lines.back().append(" ").append(word);
      used += 1 + length;
    }
  }
  return lines;
}

}  // namespace fotomill::cli
