#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// Sample format of a TIFF file.
struct TiffSampleForm {
  enum Kind { Unsigned, Signed, Float };
  uint32_t bits = 8;
  Kind kind = Unsigned;
};

// Whether samples can be converted to bytes: up to 32 bits, or 16, 32 and 64-bit floating point.
bool CanConvert(const TiffSampleForm& form);

// Converts `count` packed samples to bytes: target[0], target[step], ... With `scaled`, the full
// range (for floating point 0 to 1) is mapped to 0 to 255, rounded; otherwise samples of up to 8
// bits keep their value. Samples of 16, 24, 32 and 64 bits are in native byte order, others in
// big-endian bit order, as delivered by the library.
void ConvertSamples(const uint8_t* source, const TiffSampleForm& form, bool scaled, size_t count,
                    uint8_t* target, size_t step);

}  // namespace fotomill
