#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/byte_reader.h"

namespace fotomill {

// The three row codings of bitmaps in WordPerfect graphics.
//
//   version 1:  80 n            n bytes of FF
//               80 + n, v       n bytes of value v
//               00 n            at the start of a row: the previous row is repeated n times
//               n bytes         n literal bytes
//   version 2:  7D n            sets the unit size to n bytes
//               7E              the row is XORed with the previous row
//               7F n            n + 1 units of 0
//               FF n            n + 1 units of FF
//               FD n            the unit of the last run n + 1 times
//               FE n            at the start of a row: the previous row is repeated n + 1 times
//               80 + n, unit    a run: the unit n + 1 times
//               n units         n + 1 literal units
//
// Runs may continue in the next row. Source: J. Murray and W. vanRyper, "Encyclopedia of Graphics
// File Formats", 2nd edition (1996), with WordPerfect Corporation's text; Corel, "WordPerfect
// Graphics Format", software developer's kit.
enum class WpgCoding { Plain, Runs1, Runs2 };

class WpgRows {
 public:
  // `code` must outlive the reader; `rowSize` is in bytes.
  WpgRows(std::span<const uint8_t> code, size_t rowSize, WpgCoding coding)
      : bytes_(code), rowSize_(rowSize), coding_(coding) {}

  // The next row, valid until the next call; empty if the data are truncated.
  std::span<const uint8_t> Next();
  uint64_t Position() const { return bytes_.Position(); }  // offset in the data

 private:
  bool TakeToken1();
  bool TakeToken2();
  void Append(size_t count, std::span<const uint8_t> unit);

  ByteReader bytes_;
  const size_t rowSize_;
  const WpgCoding coding_;
  std::vector<uint8_t> pending_;     // bytes of the row, and of later ones
  std::vector<uint8_t> row_;         // the last row returned
  std::vector<uint8_t> unit_ = {0};  // of version 2's last run
  int repeats_ = 0;                  // remaining repetitions of the row
  bool difference_ = false;          // the current row is XORed
};

// Appends a row coded for version 1, without its repetitions.
void EncodeWpgRow(std::span<const uint8_t> row, std::vector<uint8_t>& code);

}  // namespace fotomill
