#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace fotomill {

// The text of an INI file: lines "[section]", lines "key=value", anything else (comments, empty
// lines) is kept and means nothing. Bytes are taken as they are. Section and key names are matched
// exactly; blanks around a key and a section line do not count. The value is everything behind the
// "=", blanks included. Lines end in LF or CR LF.
//
// If a key appears more than once in its section, the first one counts.

// An "=" line of the section that was asked for. Views into the text.
struct IniEntry {
  std::string_view key;
  std::string_view value;
  size_t line = 0;  // counted from 1
};

// Walks the entries of one section in file order, also where the section is divided. The text
// outlives the reader.
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

// The value that counts of one key, nullopt when the section does not hold it.
std::optional<std::string_view> FindIniValue(std::string_view text, std::string_view section,
                                             std::string_view key);

// One change: the value that a key gets (no line breaks in it), or its removal.
struct IniEdit {
  std::string_view key;
  std::optional<std::string_view> value;
};

// The text with changes made to one section; everything else stays byte for byte. A key that is
// there keeps its place, new keys come to the end of the section, and the section to the end of the
// text if there is none. Lines get the line end that the text has. `edits` names no key twice.
std::string EditIni(std::string_view text, std::string_view section,
                    std::span<const IniEdit> edits);

// Whether the text is written in another encoding (UTF-16), so that it can neither be read nor
// changed byte by byte.
bool IsWideText(std::string_view text);

}  // namespace fotomill
