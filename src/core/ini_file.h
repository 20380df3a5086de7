#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// The text of an INI file: "[section]" lines, "key=value" lines; anything else (comments, empty
// lines) is kept and ignored. Bytes are not decoded. Section and key names are case-sensitive;
// blanks around a key or a section line are ignored. The value is everything after the "=", blanks
// included. Lines end in LF or CR LF.
//
// If a key appears more than once in its section, the first one counts.

// An entry of the requested section. Views into the text.
struct IniEntry {
  std::string_view key;
  std::string_view value;
  size_t line = 0;  // counted from 1
};

// Iterates over the entries of one section in file order, even if the section is split. The text
// must outlive the reader.
class IniReader {
 public:
  // Reads one section; the text must outlive it.
  IniReader(std::string_view text, std::string_view section);
  // False at the end of the text.
  bool Next(IniEntry& entry);

 private:
  std::string_view rest_;
  std::string_view section_;
  bool inside_ = false;
  size_t line_ = 0;
};

// The value of a key, nullopt if the section does not have it.
std::optional<std::string_view> FindIniValue(std::string_view text, std::string_view section,
                                             std::string_view key);

// One change: a new value for a key (no line breaks in it), or its removal.
struct IniEdit {
  std::string_view key;
  std::optional<std::string_view> value;
};

// The text with changes to one section; everything else stays byte for byte. Existing keys keep
// their position, new keys are appended to the section, and a new section to the text. Line endings
// match the text. `edits` must not name a key twice.
std::string EditIni(std::string_view text, std::string_view section,
                    std::span<const IniEdit> edits);

// Whether the text is in another encoding (UTF-16), so it can be neither read nor edited
// byte by byte.
bool IsWideText(std::string_view text);

}  // namespace fotomill
