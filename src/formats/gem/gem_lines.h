#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

#include "core/byte_reader.h"

namespace fotomill {

// Line coding of GEM rasters. A line consists of all planes of a row.
//
//   00 00 FF n     at the start of a line: the line is repeated n times
//   00 n pattern   n times the pattern, whose length is in the header
//   80 n bytes     n literal bytes
//   n              n bytes of 0, or with 80 added, n bytes of FF
//
// Extensions by snapshot programs: 80 00 stands for 256 bytes, and 00 00 n within a line for n + 1
// bytes of the line above. Runs may continue into the next line. Source: J. Murray and W. vanRyper,
// "Encyclopedia of Graphics File Formats", 2nd edition (1996), GEM Raster.
class GemLines {
 public:
  // `code` must outlive the reader; `lineSize` and `patternSize` are in bytes.
  GemLines(std::span<const uint8_t> code, size_t lineSize, size_t patternSize)
      : bytes_(code), lineSize_(lineSize), patternSize_(patternSize) {}

  // The next line, valid until the next call; empty if the data are truncated.
  std::span<const uint8_t> Next();
  uint64_t Position() const { return bytes_.Position(); }  // offset in the data

 private:
  bool Fill();
  bool TakeToken();

  ByteReader bytes_;
  const size_t lineSize_, patternSize_;
  std::vector<uint8_t> line_;  // followed by bytes that belong to the next line
  std::vector<uint8_t> above_;
  int repeats_ = 0;  // remaining repetitions of the line
};

// Appends an encoded line, without its repetitions. Repeated patterns of `unit` bytes become runs;
// `unit` is the header's pattern length.
void EncodeGemLine(std::span<const uint8_t> line, size_t unit, std::vector<uint8_t>& code);

}  // namespace fotomill
