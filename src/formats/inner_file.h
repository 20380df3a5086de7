#pragma once

#include <span>
#include <string>

#include "formats/format_entry.h"
#include "platform/temporary_file.h"

namespace fotomill {

// A picture file inside another file, in a temporary file for its own codec.
struct InnerFile {
  std::string name;  // as stored in the outer file
  platform::TemporaryFile file;
  ReadRequest request = {};
  const FormatEntry* row = nullptr;
};

// The row of a built-in format for a name's extension: an exact match, else one with the same first
// three characters. Null if not found.
const FormatEntry* InnerRowOfName(std::string_view name);
// Whether files of a row contain other files; those cannot be nested.
bool IsWrapper(const FormatEntry& row);
// Whether such a file can be an inner file.
bool IsInnerRow(const FormatEntry& row);

// Creates the empty temporary file for `inner.name`. UnsupportedFormat for a wrapper,
// ErrorCreatingFile.
Status CreateInnerFile(const ReadRequest& request, InnerFile& inner);
// After writing the file, finds its row by name or, if that fails, by contents. FileOpenError,
// UnsupportedFormat if no format can read it.
Status FindInnerRow(InnerFile& inner);

}  // namespace fotomill
