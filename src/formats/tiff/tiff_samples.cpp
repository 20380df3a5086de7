#include "formats/tiff/tiff_samples.h"

#include <bit>
#include <cmath>
#include <cstring>

namespace fotomill {

namespace {

uint8_t FromReal(double value) {
  if (!(value > 0)) return 0;  // also for NaN
  return value >= 1 ? 255 : static_cast<uint8_t>(value * 255 + 0.5);
}

// Source: IEEE 754-2008, binary16.
double HalfToReal(uint16_t half) {
  const int exponent = half >> 10 & 31, fraction = half & 1023;
  double value = 0;
  if (exponent == 31) {
    value = fraction == 0 ? INFINITY : NAN;
  } else {
    value = exponent == 0 ? std::ldexp(fraction, -24) : std::ldexp(fraction + 1024, exponent - 25);
  }
  return (half & 0x8000) != 0 ? -value : value;
}

template <typename T>
T Load(const uint8_t* source) {
  T value;
  std::memcpy(&value, source, sizeof value);
  return value;
}

uint32_t LoadBits(const uint8_t* source, size_t index, uint32_t bits) {
  const uint64_t first = uint64_t{index} * bits;
  uint64_t value = 0;
  uint32_t taken = 0;
  for (uint64_t byte = first / 8; taken < bits + first % 8; ++byte, taken += 8)
    value = value << 8 | source[byte];
  return static_cast<uint32_t>(value >> (taken - first % 8 - bits) & ((uint64_t{1} << bits) - 1));
}

uint32_t LoadInteger(const uint8_t* source, size_t index, uint32_t bits) {
  if (bits == 8) return source[index];
  if (bits == 16) return Load<uint16_t>(source + 2 * index);
  if (bits == 32) return Load<uint32_t>(source + 4 * index);
  if (bits == 24) {
    const uint8_t* bytes = source + 3 * index;
    const bool little = std::endian::native == std::endian::little;
    return static_cast<uint32_t>(bytes[little ? 2 : 0] << 16 | bytes[1] << 8 |
                                 bytes[little ? 0 : 2]);
  }
  return LoadBits(source, index, bits);
}

double LoadReal(const uint8_t* source, size_t index, uint32_t bits) {
  if (bits == 16) return HalfToReal(Load<uint16_t>(source + 2 * index));
  return bits == 32 ? Load<float>(source + 4 * index) : Load<double>(source + 8 * index);
}

}  // namespace

bool CanConvert(const TiffSampleForm& form) {
  if (form.kind == TiffSampleForm::Float)
    return form.bits == 16 || form.bits == 32 || form.bits == 64;
  return form.bits >= 1 && form.bits <= 32;
}

void ConvertSamples(const uint8_t* source, const TiffSampleForm& form, bool scaled, size_t count,
                    uint8_t* target, size_t step) {
  if (form.kind == TiffSampleForm::Float) {
    for (size_t i = 0; i < count; ++i) target[i * step] = FromReal(LoadReal(source, i, form.bits));
    return;
  }
  if (form.bits == 8 && form.kind == TiffSampleForm::Unsigned) {
    for (size_t i = 0; i < count; ++i) target[i * step] = source[i];
    return;
  }
  if (form.bits == 16 && form.kind == TiffSampleForm::Unsigned) {
    for (size_t i = 0; i < count; ++i) {
      target[i * step] =
          static_cast<uint8_t>((Load<uint16_t>(source + 2 * i) * 255u + 32895) >> 16);
    }
    return;
  }
  const uint64_t most = (uint64_t{1} << form.bits) - 1;
  // Signed samples are shifted so that the lowest value is black. Bytes are not: programs that
  // write them mean 0 to 255.
  const auto sign = static_cast<uint32_t>(
      form.kind == TiffSampleForm::Signed && form.bits != 8 ? uint64_t{1} << (form.bits - 1) : 0);
  for (size_t i = 0; i < count; ++i) {
    const uint32_t value = LoadInteger(source, i, form.bits) ^ sign;
    target[i * step] =
        static_cast<uint8_t>(scaled ? (uint64_t{value} * 255 + most / 2) / most : value);
  }
}

}  // namespace fotomill
