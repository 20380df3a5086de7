#include "processing/geometry/resample_kernels.h"

#include "platform/vector.h"

namespace fotomill {

namespace {

using FourInts [[gnu::vector_size(16)]] = int32_t;
using EightShorts [[gnu::vector_size(16)]] = int16_t;
using EightBytes [[gnu::vector_size(8)]] = uint8_t;

// 16-byte vectors, in the baseline of every build or emulated by the compiler.
namespace baseline {

constexpr int kBytes = 16;
constexpr int32_t kPixelsAtOnce = 2;
using Shorts = EightShorts;
using Ints = FourInts;

template <typename T>
inline T LoadAs(const void* bytes) {
  T value;
  __builtin_memcpy(&value, bytes, sizeof value);
  return value;
}

inline Shorts Load(const int16_t* samples) { return LoadAs<Shorts>(samples); }
inline Shorts Load(const uint8_t* levels) {
  return __builtin_convertvector(LoadAs<EightBytes>(levels), Shorts);
}
inline Shorts InterleaveLow(Shorts a, Shorts b) {
  return __builtin_shufflevector(a, b, 0, 8, 1, 9, 2, 10, 3, 11);
}
inline Shorts InterleaveHigh(Shorts a, Shorts b) {
  return __builtin_shufflevector(a, b, 4, 12, 5, 13, 6, 14, 7, 15);
}

#if defined(__SSE2__)
inline Ints MultiplyAddPairs(Shorts a, Shorts b) {
  return (Ints)_mm_madd_epi16((__m128i)a, (__m128i)b);
}
inline Shorts Pack(Ints low, Ints high) {
  return (Shorts)_mm_packs_epi32((__m128i)low, (__m128i)high);
}
#else
inline Ints MultiplyAddPairs(Shorts a, Shorts b) {
  Ints sum;
  for (int i = 0; i < 4; ++i) sum[i] = a[2 * i] * b[2 * i] + a[2 * i + 1] * b[2 * i + 1];
  return sum;
}
inline Shorts Pack(Ints low, Ints high) {
  Shorts packed;
  for (int i = 0; i < 8; ++i) {
    const int32_t value = i < 4 ? low[i] : high[i - 4];
    packed[i] = static_cast<int16_t>(value < -32768 ? -32768 : value > 32767 ? 32767 : value);
  }
  return packed;
}
#endif
inline uint64_t PackSamples(FourInts samples) {
  const Shorts shorts = Pack(samples, samples);
  return LoadAs<uint64_t>(&shorts);
}

inline Shorts TwoWeights(const int16_t* weights) {
  return (Shorts)(Ints{} + LoadAs<int32_t>(weights));
}
inline Shorts WeightsOfPairs(const int16_t* weights) { return TwoWeights(weights); }
// Two pixels, by channel.
template <int channels>
inline Shorts LoadPixelPairs(const int16_t* pixels) {
  return InterleaveLow(Load(pixels), Load(pixels + channels));
}
inline FourInts AddHalves(Ints sum) { return sum; }

#include "processing/geometry/resample_kernels.inc"

}  // namespace baseline

#if VECTOR_HAS_AVX2
VECTOR_AVX2_BEGIN
namespace avx2 {

constexpr int kBytes = 32;
constexpr int32_t kPixelsAtOnce = 4;
using Shorts [[gnu::vector_size(32)]] = int16_t;
using Ints [[gnu::vector_size(32)]] = int32_t;

template <typename T>
inline T LoadAs(const void* bytes) {
  T value;
  __builtin_memcpy(&value, bytes, sizeof value);
  return value;
}

inline Shorts Load(const int16_t* samples) { return LoadAs<Shorts>(samples); }
inline Shorts Load(const uint8_t* levels) {
  return (Shorts)_mm256_cvtepu8_epi16(LoadAs<__m128i>(levels));
}
// Within each half of 16 bytes; Pack restores the order.
inline Shorts InterleaveLow(Shorts a, Shorts b) {
  return __builtin_shufflevector(a, b, 0, 16, 1, 17, 2, 18, 3, 19, 8, 24, 9, 25, 10, 26, 11, 27);
}
inline Shorts InterleaveHigh(Shorts a, Shorts b) {
  return __builtin_shufflevector(a, b, 4, 20, 5, 21, 6, 22, 7, 23, 12, 28, 13, 29, 14, 30, 15, 31);
}
inline Ints MultiplyAddPairs(Shorts a, Shorts b) {
  return (Ints)_mm256_madd_epi16((__m256i)a, (__m256i)b);
}
inline Shorts Pack(Ints low, Ints high) {
  return (Shorts)_mm256_packs_epi32((__m256i)low, (__m256i)high);
}
inline uint64_t PackSamples(FourInts samples) {
  const __m128i shorts = _mm_packs_epi32((__m128i)samples, (__m128i)samples);
  return LoadAs<uint64_t>(&shorts);
}

inline Shorts TwoWeights(const int16_t* weights) {
  return (Shorts)(Ints{} + LoadAs<int32_t>(weights));
}
inline Shorts WeightsOfPairs(const int16_t* weights) {
  const Ints both = (Ints)_mm256_set1_epi64x(LoadAs<int64_t>(weights));
  return (Shorts)__builtin_shufflevector(both, both, 0, 0, 0, 0, 1, 1, 1, 1);
}
// Four pixels, two in each half, by channel.
template <int channels>
inline Shorts LoadPixelPairs(const int16_t* pixels) {
  const EightShorts low = LoadAs<EightShorts>(pixels),
                    high = LoadAs<EightShorts>(pixels + 2 * channels);
  const Shorts four =
      __builtin_shufflevector(low, high, 0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15);
  if constexpr (channels == 3) {
    return __builtin_shufflevector(four, four, 0, 3, 1, 4, 2, 5, 6, 7, 8, 11, 9, 12, 10, 13, 14,
                                   15);
  } else {
    return __builtin_shufflevector(four, four, 0, 4, 1, 5, 2, 6, 3, 7, 8, 12, 9, 13, 10, 14, 11,
                                   15);
  }
}
inline FourInts AddHalves(Ints sum) {
  return __builtin_shufflevector(sum, sum, 0, 1, 2, 3) +
         __builtin_shufflevector(sum, sum, 4, 5, 6, 7);
}

#include "processing/geometry/resample_kernels.inc"

}  // namespace avx2
VECTOR_AVX2_END
#endif

}  // namespace

const ResampleKernels& ResampleKernelsHere() {
#if VECTOR_HAS_AVX2
  if (platform::HasAvx2()) return avx2::kKernels;
#endif
  return BaselineResampleKernels();
}

const ResampleKernels& BaselineResampleKernels() { return baseline::kKernels; }

}  // namespace fotomill
