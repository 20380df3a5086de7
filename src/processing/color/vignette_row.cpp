#include "processing/color/vignette_row.h"

#include <algorithm>
#include <cmath>

#include "platform/vector.h"
#include "processing/color/point_effect.h"

namespace fotomill {

namespace {

void Shade(const VignetteRow& row, uint8_t* bgr, size_t pixels) {
  for (size_t x = 0; x < pixels; ++x, bgr += 3) {
    const double square = row.across[x] + row.down;
    if (square <= row.size * row.size) continue;
    const double s = std::min((std::sqrt(square) - row.size) / (1 - row.size), 1.0);
    const double share = row.amount * s * s * (3 - 2 * s);
    for (size_t c = 0; c < 3; ++c)
      bgr[c] = RoundedLevel(bgr[c] + (row.color[c] - bgr[c]) * share);
  }
}

#if VECTOR_HAS_AVX2
VECTOR_AVX2_BEGIN
// Blends four levels with the color.
__m128i Blended(uint32_t levels, __m256d color, __m256d shares) {
  const __m256d old =
      _mm256_cvtepi32_pd(_mm_cvtepu8_epi32(_mm_cvtsi32_si128(static_cast<int>(levels))));
  const __m256d blended =
      _mm256_add_pd(old, _mm256_mul_pd(_mm256_sub_pd(color, old), shares));
  return _mm256_cvttpd_epi32(_mm256_add_pd(blended, _mm256_set1_pd(0.5)));
}

// Four pixels at a time, with the same operations in the same order.
void ShadeAvx2(const VignetteRow& row, uint8_t* bgr, size_t pixels) {
  const __m256d down = _mm256_set1_pd(row.down), size = _mm256_set1_pd(row.size),
                room = _mm256_set1_pd(1 - row.size), amount = _mm256_set1_pd(row.amount),
                untouched = _mm256_set1_pd(row.size * row.size), one = _mm256_set1_pd(1),
                two = _mm256_set1_pd(2), three = _mm256_set1_pd(3);
  const double b = row.color[0], g = row.color[1], r = row.color[2];
  const __m256d first = _mm256_setr_pd(b, g, r, b), second = _mm256_setr_pd(g, r, b, g),
                third = _mm256_setr_pd(r, b, g, r);
  size_t x = 0;
  for (; x + 4 <= pixels; x += 4, bgr += 12) {
    const __m256d square = _mm256_add_pd(_mm256_loadu_pd(row.across + x), down);
    const __m256d seen = _mm256_cmp_pd(square, untouched, _CMP_GT_OQ);
    if (_mm256_movemask_pd(seen) == 0) continue;
    const __m256d s = _mm256_min_pd(
        _mm256_div_pd(_mm256_sub_pd(_mm256_sqrt_pd(square), size), room), one);
    const __m256d curve = _mm256_mul_pd(_mm256_mul_pd(_mm256_mul_pd(amount, s), s),
                                        _mm256_sub_pd(three, _mm256_mul_pd(two, s)));
    const __m256d share = _mm256_and_pd(curve, seen);
    uint32_t levels[3];
    __builtin_memcpy(levels, bgr, sizeof levels);
    // the shares of pixels 0 0 0 1, 1 1 2 2 and 2 3 3 3
    const __m128i a = Blended(levels[0], first, _mm256_permute4x64_pd(share, 0x40)),
                  c = Blended(levels[1], second, _mm256_permute4x64_pd(share, 0xA5)),
                  d = Blended(levels[2], third, _mm256_permute4x64_pd(share, 0xFE));
    const __m128i packed =
        _mm_packus_epi16(_mm_packus_epi32(a, c), _mm_packus_epi32(d, d));
    __builtin_memcpy(bgr, &packed, sizeof levels);
  }
  const VignetteRow rest{row.across + x, row.down, row.size, row.amount,
                         {row.color[0], row.color[1], row.color[2]}};
  Shade(rest, bgr, pixels - x);
}
VECTOR_AVX2_END
#endif

}  // namespace

ShadeRow ShadeRowHere() {
#if VECTOR_HAS_AVX2
  if (platform::HasAvx2()) return ShadeAvx2;
#endif
  return Shade;
}

ShadeRow BaselineShadeRow() { return Shade; }

}  // namespace fotomill
