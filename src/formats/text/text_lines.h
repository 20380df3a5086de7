#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace fotomill {

// The character sets of text files that are told apart.
enum class TextCoding { Utf8, Utf16, Windows1252 };

// What a text file shows: characters in lines.
struct TextLines {
  TextCoding coding = TextCoding::Utf8;
  std::vector<std::u32string> lines;
  size_t columns = 0;     // of the longest line
  bool cutShort = false;  // there was more than a picture shows
};

// The character of a byte of Windows-1252, U+FFFD for the few that have none.
char32_t WindowsCharacter(uint8_t byte);
// Whether a character is a control character, or a mark upon the one before it.
bool TakesNoRoom(char32_t c);

// A picture shows so many lines; longer ones are broken.
inline constexpr size_t kMostTextLines = 5000, kMostTextColumns = 500;

// Takes a text apart: UTF-16 with a byte order mark, else UTF-8 if it is that from end to end, else
// Windows-1252. Tabs become blanks up to the next multiple of eight columns; marks that take no
// room and control characters are left out. `whole`: the file has no more bytes. False for bytes
// that are no text.
bool ReadTextLines(std::span<const uint8_t> file, bool whole, TextLines& text);

}  // namespace fotomill
