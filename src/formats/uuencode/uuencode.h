#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// Files as lines of text.
//
//   begin MODE NAME    three octal digits of permissions, the file's name
//   lines              of up to 45 bytes: a character for their number, then four for every three
//                      bytes, 6 bits each from the highest down
//   `                  a line without bytes
//   end
//
// A value of 6 bits is a character from the blank (0) to "_" (63); "`" stands for 0 as well. Some
// programs add a check character to each line, which is not looked at. Text before "begin" is
// passed over. Source: The Open Group, POSIX.1-2017, uuencode.
struct UuencodedFile {
  std::string name;  // without any folders, may be empty
  std::vector<uint8_t> bytes;
};

// DamagedFile without a "begin" line, or for a line that is none of the data; FileReadError when
// there is no end. `relaxed`: lines that are no data are passed over, those that were cut are
// filled up with zeros, and the end may be missing. UnsupportedFormat (8) for data in base 64,
// MemoryAllocationError for more than one file may take.
Status DecodeUuencoded(std::span<const uint8_t> text, bool relaxed, UuencodedFile& file);

// Writes a file under that name, in which control characters and separators become "_".
void EncodeUuencoded(std::span<const uint8_t> bytes, std::string_view name, ByteWriter& out);

}  // namespace fotomill
