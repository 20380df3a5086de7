#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// A number in PDF syntax: at most four decimals, no exponent.
std::string PdfNumber(double value);
// A text string: ASCII in parentheses, else UTF-16 with byte order mark as hex digits. Invalid
// UTF-8 becomes U+FFFD.
std::string PdfText(std::string_view utf8);
// "12 0 R".
std::string PdfReference(int32_t object);

// Compresses bytes with deflate, as FlateDecode takes them. MemoryAllocationError.
Status Deflated(std::span<const uint8_t> bytes, std::vector<uint8_t>& packed);

// Writes the objects of a PDF file, each at once, so that memory does not grow with the file.
// Source: ISO 32000-1:2008, section 7.5.
class PdfFile {
 public:
  // ErrorCreatingFile, MemoryAllocationError.
  Status Create(const std::string& path);
  // Reserves an object number, from 1.
  int32_t NewObject();
  // Writes an object: a dictionary, array or other value in PDF syntax.
  void Write(int32_t object, std::string_view value);
  // Writes a stream. `entries` are those of its dictionary apart from the length.
  void WriteStream(int32_t object, std::string_view entries, std::span<const uint8_t> bytes);
  // As above, compressed with deflate. MemoryAllocationError.
  Status WriteDeflated(int32_t object, std::string_view entries, std::span<const uint8_t> bytes);
  // Writes the cross-reference table and gives the file its name. `id` is a hex string that
  // identifies the contents. ErrorWritingFile, ErrorCreatingFile if the name was taken meanwhile.
  Status Finish(int32_t catalog, int32_t info, const std::string& id, platform::Existing existing);
  // Whether a write has failed, so that going on is pointless.
  bool Failed() const { return out_.Failed(); }

 private:
  void Begin(int32_t object);

  ByteWriter out_;
  std::vector<uint64_t> offsets_;  // by object number - 1; 0: not written
};

}  // namespace fotomill
