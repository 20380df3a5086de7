#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>

#include "platform/vector.h"

namespace fotomill {

// Four weights along an axis that add up to kWeightOne.
inline constexpr int32_t kWeightBits = 14;
inline constexpr int32_t kWeightOne = 1 << kWeightBits;
using Weights = int16_t[4];

// Column sums between the two passes keep six
// fractional bits, so that they fit in 16 bits.
inline constexpr int32_t kColumnShift = kWeightBits - 6;
inline constexpr int32_t kSumShift = kWeightBits + 6;

// Weighted sum of 4 x 4 pixels: vertical, then horizontal. `rows` point to the first pixel
// of each row; 16 bytes of each may be read. Rounded, ties up, and clamped. Both versions
// give identical results.
inline void SampleBgrPlain(const uint8_t* const rows[4], const Weights& across, const Weights& down,
                           uint8_t* bgr) {
  for (int c = 0; c < 3; ++c) {
    int32_t sum = 1 << (kSumShift - 1);
    for (int i = 0; i < 4; ++i) {
      int32_t column = 1 << (kColumnShift - 1);
      for (int j = 0; j < 4; ++j) column += rows[j][3 * i + c] * down[j];
      sum += (column >> kColumnShift) * across[i];
    }
    bgr[c] = static_cast<uint8_t>(std::clamp(sum >> kSumShift, 0, 255));
  }
}

#if VECTOR_HAS_AVX2  // x86-64, which always has SSE2
// Four column sums, for bytes 4 n to 4 n + 3: `upper` has those of rows 0 and 1 interleaved as
// words, `lower` those of rows 2 and 3.
inline __m128i ColumnSums(__m128i upper, __m128i lower, __m128i upperWeights,
                          __m128i lowerWeights) {
  const __m128i sum =
      _mm_add_epi32(_mm_madd_epi16(upper, upperWeights), _mm_madd_epi16(lower, lowerWeights));
  return _mm_srai_epi32(_mm_add_epi32(sum, _mm_set1_epi32(1 << (kColumnShift - 1))), kColumnShift);
}

inline void SampleBgr(const uint8_t* const rows[4], const Weights& across, const Weights& down,
                      uint8_t* bgr) {
  int32_t pairs[4];
  std::memcpy(pairs, across, 8);
  std::memcpy(pairs + 2, down, 8);
  const __m128i upperWeights = _mm_set1_epi32(pairs[2]), lowerWeights = _mm_set1_epi32(pairs[3]),
                zero = _mm_setzero_si128();
  __m128i row[4];
  std::memcpy(&row[0], rows[0], 16);
  std::memcpy(&row[1], rows[1], 16);
  std::memcpy(&row[2], rows[2], 16);
  std::memcpy(&row[3], rows[3], 16);
  const __m128i upper = _mm_unpacklo_epi8(row[0], row[1]),
                lower = _mm_unpacklo_epi8(row[2], row[3]);
  const __m128i first = ColumnSums(_mm_unpacklo_epi8(upper, zero), _mm_unpacklo_epi8(lower, zero),
                                   upperWeights, lowerWeights);
  const __m128i second = ColumnSums(_mm_unpackhi_epi8(upper, zero), _mm_unpackhi_epi8(lower, zero),
                                    upperWeights, lowerWeights);
  const __m128i third = ColumnSums(_mm_unpacklo_epi8(_mm_unpackhi_epi8(row[0], row[1]), zero),
                                   _mm_unpacklo_epi8(_mm_unpackhi_epi8(row[2], row[3]), zero),
                                   upperWeights, lowerWeights);
  // Words: b0 g0 r0 b1 g1 r1 b2 g2 and r2 b3 g3 r3.
  const __m128i front = _mm_packs_epi32(first, second), back = _mm_packs_epi32(third, third);
  // starting at b2
  const __m128i end = _mm_or_si128(_mm_srli_si128(front, 12), _mm_slli_si128(back, 4));
  const __m128i left = _mm_unpacklo_epi16(front, _mm_srli_si128(front, 6)),
                right = _mm_unpacklo_epi16(end, _mm_srli_si128(end, 6));
  __m128i sum = _mm_add_epi32(_mm_madd_epi16(left, _mm_set1_epi32(pairs[0])),
                              _mm_madd_epi16(right, _mm_set1_epi32(pairs[1])));
  sum = _mm_srai_epi32(_mm_add_epi32(sum, _mm_set1_epi32(1 << (kSumShift - 1))), kSumShift);
  const int32_t pixel = _mm_cvtsi128_si32(_mm_packus_epi16(_mm_packs_epi32(sum, sum), zero));
  std::memcpy(bgr, &pixel, 3);
}
#else
inline void SampleBgr(const uint8_t* const rows[4], const Weights& across, const Weights& down,
                      uint8_t* bgr) {
  SampleBgrPlain(rows, across, down, bgr);
}
#endif

}  // namespace fotomill
