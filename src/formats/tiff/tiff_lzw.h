#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// TIFF's LZW: codes of 9 to 12 bits, most significant bit first, with the width growing one code
// early; 256 clears the table, 257 ends. Source: Adobe, "TIFF Revision 6.0", section 13.

// Decodes strips or tiles.
class TiffLzwDecoder {
 public:
  // Decodes exactly `size` bytes, which are valid until the next call and may be modified.
  // Null if the data are truncated, contain an invalid code, or are of the old variant with
  // reversed bit order.
  uint8_t* Decode(std::span<const uint8_t> source, size_t size);

 private:
  // A string, referring to its first occurrence: in the output, or in the bytes before it, one for
  // each value.
  struct Entry {
    uint32_t place, length;
  };
  static constexpr uint32_t kLiterals = 256, kMostCodes = 4096, kSlack = 32;

  std::array<Entry, kMostCodes> entries_;
  std::vector<uint8_t> output_;
};

// Encodes strips or tiles.
class TiffLzwEncoder {
 public:
  // Replaces `coded` with the encoded `source`.
  void Encode(std::span<const uint8_t> source, std::vector<uint8_t>& coded);

 private:
  static constexpr uint32_t kSlots = 8192;  // at least twice the number of codes

  std::array<uint32_t, kSlots> slots_;  // prefix, byte and code of a string; 0: free
};

}  // namespace fotomill
