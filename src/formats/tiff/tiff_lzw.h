#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// The LZW of TIFF: codes of 9 to 12 bits, most significant bit first, each width left one code
// early; 256 clears the table, 257 ends. Source: Adobe, "TIFF Revision 6.0", section 13.

// Decodes strips or tiles, one after the other.
class TiffLzwDecoder {
 public:
  // Decodes exactly `size` bytes, which live until the next call and may be changed. Null when the
  // data end before, name a code that cannot be, or are of the old kind with its bits the other way
  // round.
  uint8_t* Decode(std::span<const uint8_t> source, size_t size);

 private:
  // A string is where it came up first: in the output, or in the bytes in front of it, of which
  // there is one of each value.
  struct Entry {
    uint32_t place, length;
  };
  static constexpr uint32_t kLiterals = 256, kMostCodes = 4096, kSlack = 32;

  std::array<Entry, kMostCodes> entries_;
  std::vector<uint8_t> output_;
};

// Encodes one strip or tile after the other.
class TiffLzwEncoder {
 public:
  // Replaces `coded` by the code of `source`.
  void Encode(std::span<const uint8_t> source, std::vector<uint8_t>& coded);

 private:
  static constexpr uint32_t kSlots = 8192;  // at least twice the codes

  std::array<uint32_t, kSlots> slots_;  // prefix, byte and code of a string; 0 when free
};

}  // namespace fotomill
