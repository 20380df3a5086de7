#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// The name of an archive entry as UTF-8: valid UTF-8 stays; anything else is taken for code page
// 437, which ZIP files use unless they say otherwise (PKWARE, APPNOTE.TXT 6.3.9, appendix D). A
// "./" in front is removed, as is the slash after a folder's name.
std::string ReadableEntryName(std::string_view bytes);

// Whether an entry may be extracted under its name: a relative path of at most 4,096 bytes whose
// parts are no "." or "..", at most 255 bytes long, without backslashes, colons after a drive
// letter, and control characters.
bool IsSafeEntryName(std::string_view name);

// The name under which a file is stored in an archive: its path with "/" as separator, without
// drive, leading separators and everything up to the last "..".
std::string StoredEntryName(std::string_view path);

}  // namespace fotomill
