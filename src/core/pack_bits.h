#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// PackBits, called ByteRun1 in Amiga IFF: a code byte n below 128 precedes n + 1 literal bytes, one
// above 128 precedes a byte that is repeated 257 - n times, and 128 is a no-op. Source: Apple
// Computer, Macintosh Technical Note 1023, "Understanding PackBits" (1996).

// Unpacks until `row` is full; a run that goes past its end is
// cut. `code` becomes the remaining code. False if the code
// ends before the row; the rest of the row is then unchanged.
[[nodiscard]] bool UnpackBits(std::span<const uint8_t>& code, std::span<uint8_t> row);

// The maximum packed size of `size` bytes.
constexpr size_t MostPackedBits(size_t size) { return size + (size + 127) / 128; }
// Packs a row into `code`, which must have room for MostPackedBits bytes; returns the packed size.
// Runs of two are packed only where they do not interrupt a literal run.
size_t PackBits(std::span<const uint8_t> row, uint8_t* code);

}  // namespace fotomill
