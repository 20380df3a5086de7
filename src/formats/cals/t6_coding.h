#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"

namespace fotomill {

// Two-dimensional coding of bilevel rows for group 4 fax: each row's color changes are coded
// relative to those of the row above. Rows are packed, the leftmost pixel in the highest bit, and 1
// is black. Source: ITU-T T.6 (1988).

// Decodes row by row; does not own the data.
class T6Decoder {
 public:
  // `width` is at least 1.
  T6Decoder(std::span<const uint8_t> data, int32_t width);

  // Decodes the next row into (width + 7) / 8 bytes;
  // padding bits are 0. Ok; FileReadError if the data
  // are truncated, DamagedFile for an invalid code.
  Status DecodeRow(std::span<uint8_t> row);

 private:
  uint32_t PeekBits();
  void SkipBits(int32_t count) { bit_ += static_cast<uint64_t>(count); }
  Status ReadRun(bool black, int32_t& length);
  Status ReadChanges();

  std::span<const uint8_t> data_;
  const int32_t width_;
  uint64_t bit_ = 0;                     // bit offset in the data
  // columns of the color changes, white to black first; then the width, three times
  std::vector<int32_t> above_, current_;
};

// Encodes rows into a buffer.
class T6Encoder {
 public:
  explicit T6Encoder(int32_t width);  // in pixels

  // Encodes the next row of (width + 7) / 8 bytes.
  void EncodeRow(std::span<const uint8_t> row);
  // Ends the picture; returns all of its bytes.
  const std::vector<uint8_t>& Finish();

 private:
  void Put(const char* word);
  void PutRun(bool black, int32_t length);

  const int32_t width_;
  std::vector<int32_t> above_, current_;
  std::vector<uint8_t> bytes_;
  uint32_t pending_ = 0;   // bits of an incomplete byte
  int32_t pendingBits_ = 0;
};

}  // namespace fotomill
