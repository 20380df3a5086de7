#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// The run-length code of SGI rows. Each sample is one byte, or two bytes with the high one first. A
// sample whose low seven bits are a count comes before that many samples as they are (0x80 set),
// or before one sample that is repeated; a count of 0 ends the row.

// A sample of two bytes as one of 8 bits, rounded.
uint8_t RoundSgiSample(const uint8_t* sample);

// Decodes one channel of one row. Where a row's code ends early, the rest stays as it is; what
// would go beyond the row is dropped. False when the data end before the row does.
[[nodiscard]] bool DecodeSgiRow(std::span<const uint8_t> code, std::span<uint8_t> row);
// The same for samples of two bytes.
[[nodiscard]] bool DecodeWideSgiRow(std::span<const uint8_t> code, std::span<uint8_t> row);

// The most bytes that a row of `width` samples is coded to.
constexpr size_t MostSgiCode(size_t width) { return width + width / 126 + 4; }
// Codes one channel of one row into `code`, which has room for MostSgiCode bytes; the number of
// bytes.
size_t EncodeSgiRow(std::span<const uint8_t> row, uint8_t* code);

}  // namespace fotomill
