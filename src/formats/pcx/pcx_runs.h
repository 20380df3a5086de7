#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// Run-length coding of PCX lines. A byte of 0xC0 or more, a mark, has the repeat count of the next
// byte in its low six bits; any other byte is a literal.

// Decodes line by line; runs may continue across lines. Does not own the data.
class PcxLineDecoder {
 public:
  // Decode may overwrite this many bytes after a line, in order to copy in larger blocks.
  static constexpr size_t kSlack = 64;

  // Does not own the data.
  explicit PcxLineDecoder(std::span<const uint8_t> data)
      : next_(data.data()), end_(data.data() + data.size()) {}

  // Decodes the next `size` bytes into `line`, which must have room for kSlack more. False if the
  // data are truncated.
  [[nodiscard]] bool Decode(uint8_t* line, size_t size);
  // The next undecoded byte.
  const uint8_t* Next() const { return next_; }

 private:
  const uint8_t* next_;
  const uint8_t* end_;
  size_t pending_ = 0;  // remaining count of the run at the end of the previous line
  uint8_t value_ = 0;   // value of that run
};

// Encodes one plane of a line and returns the number of bytes written to `out`, at most twice the
// plane's size. The last byte of a run is left to the next token: m equal bytes take a pair for m -
// 1 of them plus one token.
size_t EncodePcxPlane(std::span<const uint8_t> plane, uint8_t* out);

}  // namespace fotomill
