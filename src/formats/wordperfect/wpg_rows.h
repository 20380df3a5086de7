#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/byte_reader.h"

namespace fotomill {

// The three codings of bitmaps in WordPerfect graphics, row by row.
//
//   version 1:  80 n            n bytes of FF
//               80 + n, v       n bytes of value v
//               00 n            at the start of a row: the row before comes n times more
//               n bytes         n bytes as they are
//   version 2:  7D n            units of n bytes from here on
//               7E              the row is the difference, by exclusive or, to the row before
//               7F n            n + 1 units of 0
//               FF n            n + 1 units of FF
//               FD n            the last unit of a run n + 1 times more
//               FE n            at the start of a row: the row before comes n + 1 times more
//               80 + n, unit    a run: the unit n + 1 times
//               n units         n + 1 units as they are
//
// Runs may go on into the next row. Source: J. Murray and W. vanRyper, "Encyclopedia of Graphics
// File Formats", 2nd edition (1996), with WordPerfect Corporation's text; Corel, "WordPerfect
// Graphics Format", software developer's kit.
enum class WpgCoding { Plain, Runs1, Runs2 };

class WpgRows {
 public:
  // `code` must outlive the reader; `rowSize` is in bytes.
  WpgRows(std::span<const uint8_t> code, size_t rowSize, WpgCoding coding)
      : bytes_(code), rowSize_(rowSize), coding_(coding) {}

  // The next row, valid until the next call; empty when the code is cut short.
  std::span<const uint8_t> Next();
  uint64_t Position() const { return bytes_.Position(); }  // in the code

 private:
  bool TakeToken1();
  bool TakeToken2();
  void Append(size_t count, std::span<const uint8_t> unit);

  ByteReader bytes_;
  const size_t rowSize_;
  const WpgCoding coding_;
  std::vector<uint8_t> pending_;     // bytes of the row, and of those behind it
  std::vector<uint8_t> row_;         // the last one that was handed out
  std::vector<uint8_t> unit_ = {0};  // of version 2's last run
  int repeats_ = 0;                  // how often the row comes again
  bool difference_ = false;          // the row in work is one
};

// Appends the code of a row of version 1, without its repetitions.
void EncodeWpgRow(std::span<const uint8_t> row, std::vector<uint8_t>& code);

}  // namespace fotomill
