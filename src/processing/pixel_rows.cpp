#include "processing/pixel_rows.h"

#include <array>

#include "core/byte_shuffle.h"

namespace fotomill {

namespace {

// Maps each byte of a plane to the lowest bits of eight 4-bit pixels, the first pixel in
// the top bits.
constexpr std::array<uint32_t, 256> MakeSpreadBits() {
  std::array<uint32_t, 256> table{};
  for (uint32_t bits = 0; bits < 256; ++bits) {
    for (uint32_t i = 0; i < 8; ++i) table[bits] |= (bits >> i & 1) << 4 * i;
  }
  return table;
}
constexpr std::array<uint32_t, 256> kSpreadBits = MakeSpreadBits();

// Packs the lowest bits of eight 4-bit pixels into a byte, the first pixel in the top bit.
constexpr uint8_t GatherBits(uint32_t pixels) {
  pixels &= 0x11111111;
  pixels = (pixels | pixels >> 3) & 0x03030303;
  pixels = (pixels | pixels >> 6) & 0x000F000F;
  return static_cast<uint8_t>(pixels | pixels >> 12);
}
static_assert(GatherBits(kSpreadBits[0xA7]) == 0xA7);

// Each of these returns the number of pixels processed; the scalar loops do the rest.
#ifdef BYTE_SHUFFLE

constexpr char kNone = -128;  // an index that selects 0

BYTE_SHUFFLE __m128i Load(const uint8_t* bytes) {
  return _mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes));
}
BYTE_SHUFFLE void Store(uint8_t* bytes, __m128i value) {
  _mm_storeu_si128(reinterpret_cast<__m128i*>(bytes), value);
}

// Every third byte of 48, starting at byte `first`: shuffles and combines three registers.
BYTE_SHUFFLE __m128i EveryThird(__m128i a, __m128i b, __m128i c, int first) {
  alignas(16) static constexpr char kIndices[3][3][16] = {
      {{0, 3, 6, 9, 12, 15, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone},
       {kNone, kNone, kNone, kNone, kNone, kNone, 2, 5, 8, 11, 14, kNone, kNone, kNone, kNone, kNone},
       {kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, 1, 4, 7, 10, 13}},
      {{1, 4, 7, 10, 13, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone},
       {kNone, kNone, kNone, kNone, kNone, 0, 3, 6, 9, 12, 15, kNone, kNone, kNone, kNone, kNone},
       {kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, 2, 5, 8, 11, 14}},
      {{2, 5, 8, 11, 14, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone},
       {kNone, kNone, kNone, kNone, kNone, 1, 4, 7, 10, 13, kNone, kNone, kNone, kNone, kNone, kNone},
       {kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, kNone, 0, 3, 6, 9, 12, 15}},
  };
  const __m128i* indices = reinterpret_cast<const __m128i*>(kIndices[first]);
  const __m128i fromA = _mm_shuffle_epi8(a, _mm_load_si128(indices));
  const __m128i fromB = _mm_shuffle_epi8(b, _mm_load_si128(indices + 1));
  const __m128i fromC = _mm_shuffle_epi8(c, _mm_load_si128(indices + 2));
  return _mm_or_si128(_mm_or_si128(fromA, fromB), fromC);
}

BYTE_SHUFFLE size_t SplitColorsFast(const uint8_t* bgr, size_t count, uint8_t* blue, uint8_t* green,
                                    uint8_t* red) {
  size_t x = 0;
  for (; x + 16 <= count; x += 16, bgr += 48) {
    const __m128i a = Load(bgr), b = Load(bgr + 16), c = Load(bgr + 32);
    Store(blue + x, EveryThird(a, b, c, 0));
    Store(green + x, EveryThird(a, b, c, 1));
    Store(red + x, EveryThird(a, b, c, 2));
  }
  return x;
}

// Sixteen bytes of the interleaved row, starting at byte 16 x `part`.
BYTE_SHUFFLE __m128i Interleaved(__m128i blue, __m128i green, __m128i red, int part) {
  alignas(16) static constexpr char kIndices[3][3][16] = {
      {{0, kNone, kNone, 1, kNone, kNone, 2, kNone, kNone, 3, kNone, kNone, 4, kNone, kNone, 5},
       {kNone, 0, kNone, kNone, 1, kNone, kNone, 2, kNone, kNone, 3, kNone, kNone, 4, kNone, kNone},
       {kNone, kNone, 0, kNone, kNone, 1, kNone, kNone, 2, kNone, kNone, 3, kNone, kNone, 4, kNone}},
      {{kNone, kNone, 6, kNone, kNone, 7, kNone, kNone, 8, kNone, kNone, 9, kNone, kNone, 10, kNone},
       {5, kNone, kNone, 6, kNone, kNone, 7, kNone, kNone, 8, kNone, kNone, 9, kNone, kNone, 10},
       {kNone, 5, kNone, kNone, 6, kNone, kNone, 7, kNone, kNone, 8, kNone, kNone, 9, kNone, kNone}},
      {{kNone, 11, kNone, kNone, 12, kNone, kNone, 13, kNone, kNone, 14, kNone, kNone, 15, kNone, kNone},
       {kNone, kNone, 11, kNone, kNone, 12, kNone, kNone, 13, kNone, kNone, 14, kNone, kNone, 15, kNone},
       {10, kNone, kNone, 11, kNone, kNone, 12, kNone, kNone, 13, kNone, kNone, 14, kNone, kNone, 15}},
  };
  const __m128i* indices = reinterpret_cast<const __m128i*>(kIndices[part]);
  const __m128i fromBlue = _mm_shuffle_epi8(blue, _mm_load_si128(indices));
  const __m128i fromGreen = _mm_shuffle_epi8(green, _mm_load_si128(indices + 1));
  const __m128i fromRed = _mm_shuffle_epi8(red, _mm_load_si128(indices + 2));
  return _mm_or_si128(_mm_or_si128(fromBlue, fromGreen), fromRed);
}

BYTE_SHUFFLE size_t MergeColorsFast(const uint8_t* blue, const uint8_t* green, const uint8_t* red,
                                    size_t count, uint8_t* bgr) {
  size_t x = 0;
  for (; x + 16 <= count; x += 16, bgr += 48) {
    const __m128i b = Load(blue + x), g = Load(green + x), r = Load(red + x);
    Store(bgr, Interleaved(b, g, r, 0));
    Store(bgr + 16, Interleaved(b, g, r, 1));
    Store(bgr + 32, Interleaved(b, g, r, 2));
  }
  return x;
}

// Four pixels at a time; the store writes four extra bytes, so the last pixels are excluded.
BYTE_SHUFFLE size_t DropFourthFast(const uint8_t* bgrx, size_t count, uint8_t* bgr) {
  const __m128i indices =
      _mm_setr_epi8(0, 1, 2, 4, 5, 6, 8, 9, 10, 12, 13, 14, kNone, kNone, kNone, kNone);
  size_t x = 0;
  for (; x + 6 <= count; x += 4) Store(bgr + 3 * x, _mm_shuffle_epi8(Load(bgrx + 4 * x), indices));
  return x;
}

// Five pixels at a time; the store writes one extra byte, so the last pixels are excluded.
BYTE_SHUFFLE size_t SwapColorsFast(const uint8_t* source, size_t count, uint8_t* target) {
  const __m128i indices = _mm_setr_epi8(2, 1, 0, 5, 4, 3, 8, 7, 6, 11, 10, 9, 14, 13, 12, kNone);
  size_t x = 0;
  for (; x + 6 <= count; x += 5)
    Store(target + 3 * x, _mm_shuffle_epi8(Load(source + 3 * x), indices));
  return x;
}

#endif

}  // namespace

void SwapColors(const uint8_t* source, size_t count, uint8_t* target) {
  size_t x = 0;
#ifdef BYTE_SHUFFLE
  if (CanShuffleBytes()) x = SwapColorsFast(source, count, target);
#endif
  for (; x < count; ++x) {
    target[3 * x] = source[3 * x + 2];
    target[3 * x + 1] = source[3 * x + 1];
    target[3 * x + 2] = source[3 * x];
  }
}

void SplitColors(const uint8_t* bgr, size_t count, uint8_t* blue, uint8_t* green, uint8_t* red) {
  size_t x = 0;
#ifdef BYTE_SHUFFLE
  if (CanShuffleBytes()) x = SplitColorsFast(bgr, count, blue, green, red);
#endif
  for (; x < count; ++x) {
    blue[x] = bgr[3 * x];
    green[x] = bgr[3 * x + 1];
    red[x] = bgr[3 * x + 2];
  }
}

void MergeColors(const uint8_t* blue, const uint8_t* green, const uint8_t* red, size_t count,
                 uint8_t* bgr) {
  size_t x = 0;
#ifdef BYTE_SHUFFLE
  if (CanShuffleBytes()) x = MergeColorsFast(blue, green, red, count, bgr);
#endif
  for (; x < count; ++x) {
    bgr[3 * x] = blue[x];
    bgr[3 * x + 1] = green[x];
    bgr[3 * x + 2] = red[x];
  }
}

void DropFourth(const uint8_t* bgrx, size_t count, uint8_t* bgr) {
  size_t x = 0;
#ifdef BYTE_SHUFFLE
  if (CanShuffleBytes()) x = DropFourthFast(bgrx, count, bgr);
#endif
  for (; x < count; ++x) {
    bgr[3 * x] = bgrx[4 * x];
    bgr[3 * x + 1] = bgrx[4 * x + 1];
    bgr[3 * x + 2] = bgrx[4 * x + 2];
  }
}

void SplitAlpha(const uint8_t* bgra, size_t count, uint8_t* bgr, uint8_t* alpha) {
  DropFourth(bgra, count, bgr);
  for (size_t x = 0; x < count; ++x) alpha[x] = bgra[4 * x + 3];
}

void MergeAlpha(const uint8_t* bgr, const uint8_t* alpha, size_t count, uint8_t* bgra) {
  for (size_t x = 0; x < count; ++x) {
    bgra[4 * x] = bgr[3 * x];
    bgra[4 * x + 1] = bgr[3 * x + 1];
    bgra[4 * x + 2] = bgr[3 * x + 2];
    bgra[4 * x + 3] = alpha[x];
  }
}

void SplitBitPlanes(const uint8_t* row, size_t count, int planes, size_t planeSize, uint8_t* bits) {
  for (size_t x = 0; x < count; x += 8) {
    const uint8_t* bytes = row + x / 2;
    uint32_t pixels =
        uint32_t{bytes[0]} << 24 | uint32_t{bytes[1]} << 16 | uint32_t{bytes[2]} << 8 | bytes[3];
    if (count - x < 8) pixels &= ~(UINT32_MAX >> 4 * (count - x));
    for (int p = 0; p < planes; ++p)
      bits[static_cast<size_t>(p) * planeSize + x / 8] = GatherBits(pixels >> p);
  }
}

void MergeBitPlanes(const uint8_t* bits, size_t count, int planes, size_t planeSize, uint8_t* row) {
  for (size_t x = 0; x < count; x += 8) {
    uint32_t pixels = 0;
    for (int p = 0; p < planes; ++p)
      pixels |= kSpreadBits[bits[static_cast<size_t>(p) * planeSize + x / 8]] << p;
    if (count - x < 8) pixels &= ~(UINT32_MAX >> 4 * (count - x));
    for (size_t i = 0; i < 4; ++i) row[x / 2 + i] = static_cast<uint8_t>(pixels >> (24 - 8 * i));
  }
}

}  // namespace fotomill
