#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// The run-length code of PCX lines. A byte of 0xC0 or more, a mark, counts in its low six bits how
// often the byte after it comes; any other byte stands for itself.

// Decodes lines one after the other; runs go on from line to line. The data stay with their owner.
class PcxLineDecoder {
 public:
  // Bytes behind a line that Decode may overwrite, so that it can copy in larger pieces.
  static constexpr size_t kSlack = 64;

  // Does not own the data.
  explicit PcxLineDecoder(std::span<const uint8_t> data)
      : next_(data.data()), end_(data.data() + data.size()) {}

  // Decodes the next `size` bytes into `line`, which has room for kSlack more. False when the data
  // end before.
  [[nodiscard]] bool Decode(uint8_t* line, size_t size);
  // The first byte that is not decoded yet.
  const uint8_t* Next() const { return next_; }

 private:
  const uint8_t* next_;
  const uint8_t* end_;
  size_t pending_ = 0;  // what the line before left of its last run
  uint8_t value_ = 0;   // of that run
};

// Codes one plane of a line and returns the number of bytes written to `out`, at most twice the
// plane's. Of a run of equal bytes the last is left to the token after it: m equal bytes cost a
// pair for m - 1 of them and one token more.
size_t EncodePcxPlane(std::span<const uint8_t> plane, uint8_t* out);

}  // namespace fotomill
