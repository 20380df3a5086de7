#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

#include "core/byte_reader.h"

namespace fotomill {

// The coding of GEM rasters, line by line. A line holds all planes of a row, one after the other.
//
//   00 00 FF n     at the start of a line: the line comes n times
//   00 n pattern   the pattern, whose length the header tells, n times
//   80 n bytes     n bytes as they are
//   n              n bytes of 0, with 80 added n bytes of FF
//
// Snapshot programs wrote more: 80 00 stands for 256 bytes, and 00 00 n within a line for n + 1
// bytes of the line above. Runs may go on into the next line. Source: J. Murray and W. vanRyper,
// "Encyclopedia of Graphics File Formats", 2nd edition (1996), GEM Raster.
class GemLines {
 public:
  // `code` must outlive the reader; `lineSize` and `patternSize` are in bytes.
  GemLines(std::span<const uint8_t> code, size_t lineSize, size_t patternSize)
      : bytes_(code), lineSize_(lineSize), patternSize_(patternSize) {}

  // The next line, valid until the next call; empty when the code is cut short.
  std::span<const uint8_t> Next();
  uint64_t Position() const { return bytes_.Position(); }  // in the code

 private:
  bool Fill();
  bool TakeToken();

  ByteReader bytes_;
  const size_t lineSize_, patternSize_;
  std::vector<uint8_t> line_;  // and behind its end what belongs to the next one
  std::vector<uint8_t> above_;
  int repeats_ = 0;  // how often the line comes again
};

// Appends the code of a line, without its repetitions. Patterns of `unit` bytes that come again
// become runs; the header's pattern length is `unit`.
void EncodeGemLine(std::span<const uint8_t> line, size_t unit, std::vector<uint8_t>& code);

}  // namespace fotomill
