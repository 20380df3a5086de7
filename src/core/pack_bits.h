#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// PackBits, which Amiga IFF calls ByteRun1: a byte n below 128 is before n + 1 bytes as they are,
// one above 128 before a byte that is repeated 257 - n times, and 128 means nothing. Source: Apple
// Computer, Macintosh Technical Note 1023, "Understanding PackBits" (1996).

// Unpacks bytes into the whole of `row`; what would go beyond it is dropped. `code` becomes what is
// left of it. False when the code ends before the row does; the rest of the row then stays as it
// is.
[[nodiscard]] bool UnpackBits(std::span<const uint8_t>& code, std::span<uint8_t> row);

// The most bytes that `size` bytes are packed to.
constexpr size_t MostPackedBits(size_t size) { return size + (size + 127) / 128; }
// Packs a row into `code`, which has room for MostPackedBits bytes; the number of bytes. Runs of
// two cost nothing and are packed only where no bytes stand as they are before them.
size_t PackBits(std::span<const uint8_t> row, uint8_t* code);

}  // namespace fotomill
