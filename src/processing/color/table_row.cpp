#include "processing/color/table_row.h"

#include "platform/vector.h"

namespace fotomill {

namespace {

void LookUp(const uint8_t* table, uint8_t* values, size_t count) {
  for (size_t i = 0; i < count; ++i) values[i] = table[values[i]];
}

#if VECTOR_HAS_AVX2
VECTOR_AVX2_BEGIN
// A shuffle looks up one of 16 entries, so the table takes 16 shuffles. Relative to a shuffle's
// first entry, values it does not cover are 16 or more; adding 112 sets their top bit, for which a
// shuffle returns 0.
void LookUpAvx2(const uint8_t* table, uint8_t* values, size_t count) {
  constexpr size_t kAtOnce = 64;
  constexpr int kParts = 16;
  __m256i parts[kParts];
  for (int i = 0; i < kParts; ++i) {
    parts[i] = _mm256_broadcastsi128_si256(
        _mm_loadu_si128(reinterpret_cast<const __m128i*>(table + kParts * i)));
  }
  const __m256i unserved = _mm256_set1_epi8(112), next = _mm256_set1_epi8(kParts);
  for (; count >= kAtOnce; count -= kAtOnce, values += kAtOnce) {
    auto* const place = reinterpret_cast<__m256i*>(values);
    __m256i first = _mm256_loadu_si256(place), second = _mm256_loadu_si256(place + 1);
    __m256i firstFound = _mm256_setzero_si256(), secondFound = _mm256_setzero_si256();
    for (int i = 0; i < kParts; ++i) {
      firstFound = _mm256_or_si256(
          firstFound, _mm256_shuffle_epi8(parts[i], _mm256_adds_epu8(first, unserved)));
      secondFound = _mm256_or_si256(
          secondFound, _mm256_shuffle_epi8(parts[i], _mm256_adds_epu8(second, unserved)));
      first = _mm256_sub_epi8(first, next);
      second = _mm256_sub_epi8(second, next);
    }
    _mm256_storeu_si256(place, firstFound);
    _mm256_storeu_si256(place + 1, secondFound);
  }
  LookUp(table, values, count);
}
VECTOR_AVX2_END
#endif

}  // namespace

TableRow TableRowHere() {
#if VECTOR_HAS_AVX2
  if (platform::HasAvx2()) return LookUpAvx2;
#endif
  return BaselineTableRow();
}

TableRow BaselineTableRow() { return LookUp; }

}  // namespace fotomill
