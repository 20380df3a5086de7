#pragma once

#include <cstddef>
#include <cstdint>

namespace fotomill {

// How the samples of a TIFF file are stored.
struct TiffSampleForm {
  enum Kind { Unsigned, Signed, Float };
  uint32_t bits = 8;
  Kind kind = Unsigned;
};

// Whether such samples can be turned into bytes: up to 32 bits, or real numbers of 16, 32 and 64.
bool CanConvert(const TiffSampleForm& form);

// Turns `count` packed samples into bytes: target[0], target[step], ... With `scaled`, the full
// range of the form (for real numbers 0 to 1) becomes 0 to 255, rounded; without it, samples of up
// to 8 bits keep their value. Samples of 16, 24, 32 and 64 bits are in the machine's byte order,
// others in big-endian bit order, as the library hands them out.
void ConvertSamples(const uint8_t* source, const TiffSampleForm& form, bool scaled, size_t count,
                    uint8_t* target, size_t step);

}  // namespace fotomill
