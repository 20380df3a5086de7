#pragma once

#include <span>
#include <string>

#include "formats/format_entry.h"
#include "platform/temporary_file.h"

namespace fotomill {

// A picture file inside another file, on disk for its own row.
struct InnerFile {
  std::string name;  // as the outer file has it
  platform::TemporaryFile file;
  ReadRequest request = {};
  const FormatEntry* row = nullptr;
};

// The row of a built-in format for a name's extension: an exact match, else one with the same first
// three characters. Null if there is none.
const FormatEntry* InnerRowOfName(std::string_view name);
// Whether a row's files contain other files, so that it reads nothing inside another one.
bool IsWrapper(const FormatEntry& row);
// Whether such a file can be read here.
bool IsInnerRow(const FormatEntry& row);

// Creates the temporary file for `inner.name`, empty. UnsupportedFormat for a wrapper,
// ErrorCreatingFile.
Status CreateInnerFile(const ReadRequest& request, InnerFile& inner);
// Finds its row once it is written, by its name or, if that fails, by its contents. FileOpenError,
// UnsupportedFormat if no row can read it.
Status FindInnerRow(InnerFile& inner);

}  // namespace fotomill
