#pragma once

#include <string>
#include <string_view>

namespace fotomill {

// The name of an archive entry as UTF-8: valid UTF-8 is kept; anything else is converted from code
// page 437, the default of ZIP files (PKWARE, APPNOTE.TXT 6.3.9, appendix D). Removes a leading
// "./" and the slash after a folder's name.
std::string ReadableEntryName(std::string_view bytes);

// Whether an entry's name is safe for extraction: a relative path of at most 4,096 bytes without
// "." and ".." parts, parts over 255 bytes, backslashes, a colon after a drive letter, and control
// characters.
bool IsSafeEntryName(std::string_view name);

// The name of a file in an archive: its path with "/" as separator, without drive, leading
// separators and everything up to the last "..".
std::string StoredEntryName(std::string_view path);

}  // namespace fotomill
