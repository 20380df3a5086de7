#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// The run-length code of SGI rows. Samples are one byte, or two bytes, big-endian. A token is a
// sample whose low seven bits are a count, followed by that many literal samples (0x80 set), or by
// one sample to repeat; a count of 0 ends the row.

// Rounds a two-byte sample to 8 bits.
uint8_t RoundSgiSample(const uint8_t* sample);

// Decodes one channel of one row. If the code ends early, the rest of the row is unchanged; excess
// samples are dropped. False if the data end before the row.
[[nodiscard]] bool DecodeSgiRow(std::span<const uint8_t> code, std::span<uint8_t> row);
// As above, for two-byte samples.
[[nodiscard]] bool DecodeWideSgiRow(std::span<const uint8_t> code, std::span<uint8_t> row);

// The maximum coded size of a row of `width` samples.
constexpr size_t MostSgiCode(size_t width) { return width + width / 126 + 4; }
// Encodes one channel of one row into `code`, which must have room for MostSgiCode bytes; returns
// the size.
size_t EncodeSgiRow(std::span<const uint8_t> row, uint8_t* code);

}  // namespace fotomill
