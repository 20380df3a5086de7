#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace fotomill {

// The supported character encodings of text files.
enum class TextCoding { Utf8, Utf16, Windows1252 };

// The contents of a text file as lines of characters.
struct TextLines {
  TextCoding coding = TextCoding::Utf8;
  std::vector<std::u32string> lines;
  size_t columns = 0;     // of the longest line
  bool cutShort = false;  // there was more than fits into a picture
};

// The character for a byte in Windows-1252, U+FFFD for the few unassigned ones.
char32_t WindowsCharacter(uint8_t byte);
// Whether a character is a control character or a combining mark.
bool TakesNoRoom(char32_t c);

// Maximum number of lines in a picture; longer lines are broken.
inline constexpr size_t kMostTextLines = 5000, kMostTextColumns = 500;

// Decodes a text: UTF-16 with a byte order mark, else UTF-8 if it is
// entirely valid, else Windows-1252. Tabs are expanded to multiples of
// eight columns; combining marks and control characters are dropped.
// `whole`: the file has no more bytes. False if the bytes are not text.
bool ReadTextLines(std::span<const uint8_t> file, bool whole, TextLines& text);

}  // namespace fotomill
