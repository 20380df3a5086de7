#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"

namespace fotomill {

// Two-dimensional coding of black and white rows, as fax machines of group 4 send them: each row
// tells how the places where its color changes differ from those of the row above. Rows are packed,
// the leftmost pixel in the highest bit, and 1 is black. Source: ITU-T T.6 (1988).

// Decodes row after row; the data stay with their owner.
class T6Decoder {
 public:
  // `width` is at least 1.
  T6Decoder(std::span<const uint8_t> data, int32_t width);

  // Decodes the next row into (width + 7) / 8 bytes; bits behind the last pixel are 0. Ok;
  // FileReadError when the data end before the row does, DamagedFile for a word that no encoder
  // writes.
  Status DecodeRow(std::span<uint8_t> row);

 private:
  uint32_t PeekBits();
  void SkipBits(int32_t count) { bit_ += static_cast<uint64_t>(count); }
  Status ReadRun(bool black, int32_t& length);
  Status ReadChanges();

  std::span<const uint8_t> data_;
  const int32_t width_;
  uint64_t bit_ = 0;                     // place of the next bit in the data
  // columns where the color changes, white first; then the width, three times
  std::vector<int32_t> above_, current_;
};

// Codes rows and gathers the bytes.
class T6Encoder {
 public:
  explicit T6Encoder(int32_t width);  // `width` in pixels

  // Codes the next row of (width + 7) / 8 bytes.
  void EncodeRow(std::span<const uint8_t> row);
  // Ends the picture; the bytes of the whole of it.
  const std::vector<uint8_t>& Finish();

 private:
  void Put(const char* word);
  void PutRun(bool black, int32_t length);

  const int32_t width_;
  std::vector<int32_t> above_, current_;
  std::vector<uint8_t> bytes_;
  uint32_t pending_ = 0;   // bits that do not fill a byte yet
  int32_t pendingBits_ = 0;
};

}  // namespace fotomill
