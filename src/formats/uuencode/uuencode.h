#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// Uuencoded text.
//
//   begin MODE NAME    three octal digits of permissions, the file's name
//   lines              of up to 45 bytes: a character for the byte count, then four characters for
//                      every three bytes, 6 bits each, highest first
//   `                  a line without bytes
//   end
//
// A 6-bit value is encoded as a character from blank (0) to "_" (63); "`" also stands for 0. Some
// programs append a check character to each line, which is ignored. Text before "begin" is skipped.
// Source: The Open Group, POSIX.1-2017, uuencode.
struct UuencodedFile {
  std::string name;  // without folders, may be empty
  std::vector<uint8_t> bytes;
};

// DamagedFile without a "begin" line, or for an invalid data line; FileReadError if there is no
// end. `relaxed`: invalid lines are skipped, truncated ones padded with zeros, and the end may be
// missing. UnsupportedFormat (8) for base64 data, MemoryAllocationError if a file exceeds the
// memory limit.
Status DecodeUuencoded(std::span<const uint8_t> text, bool relaxed, UuencodedFile& file);

// Writes a file with that name, in which control characters and separators become "_".
void EncodeUuencoded(std::span<const uint8_t> bytes, std::string_view name, ByteWriter& out);

}  // namespace fotomill
