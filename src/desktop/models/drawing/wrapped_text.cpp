#include "desktop/models/drawing/wrapped_text.h"

#include <algorithm>

namespace fotomill::desktop {

namespace {

using Fits = std::function<bool(const std::string& line)>;

bool StartsCharacter(char byte) { return (static_cast<unsigned char>(byte) & 0xc0) != 0x80; }

size_t EndOfCharacter(std::string_view text, size_t start) {
  size_t end = start + 1;
  while (end < text.size() && !StartsCharacter(text[end])) ++end;
  return end;
}

// Removes and returns as many characters of a word as fit, at least one.
std::string TakeFitting(std::string_view& word, const Fits& fits) {
  size_t end = EndOfCharacter(word, 0);
  while (end < word.size()) {
    const size_t next = EndOfCharacter(word, end);
    if (!fits(std::string(word.substr(0, next)))) break;
    end = next;
  }
  std::string taken(word.substr(0, end));
  word.remove_prefix(end);
  return taken;
}

void WrapParagraph(std::string_view text, const Fits& fits, std::vector<std::string>& lines) {
  std::string line;
  while (!text.empty()) {
    std::string_view word = text.substr(0, text.find(' '));
    text.remove_prefix(std::min(word.size() + 1, text.size()));
    if (word.empty()) continue;
    std::string longer = line.empty() ? std::string(word) : line + " " + std::string(word);
    if (fits(longer)) {
      line = std::move(longer);
      continue;
    }
    if (!line.empty()) lines.push_back(std::move(line));
    while (!fits(std::string(word)) && EndOfCharacter(word, 0) < word.size())
      lines.push_back(TakeFitting(word, fits));
    line = word;
  }
  lines.push_back(std::move(line));
}

}  // namespace

std::vector<std::string> WrapText(std::string_view text, const Fits& fits) {
  std::vector<std::string> lines;
  while (true) {
    const size_t end = text.find('\n');
    std::string_view paragraph = text.substr(0, end);
    if (paragraph.ends_with('\r')) paragraph.remove_suffix(1);
    WrapParagraph(paragraph, fits, lines);
    if (end == std::string_view::npos) return lines;
    text.remove_prefix(end + 1);
  }
}

}  // namespace fotomill::desktop
