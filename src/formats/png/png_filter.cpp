#include "formats/png/png_filter.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "platform/vector.h"

namespace fotomill {

namespace {

inline uint8_t Nearest(int left, int above, int corner) {
  const int fromLeft = std::abs(above - corner), fromAbove = std::abs(left - corner);
  const int fromCorner = std::abs(left + above - 2 * corner);
  if (fromLeft <= fromAbove && fromLeft <= fromCorner) return static_cast<uint8_t>(left);
  return static_cast<uint8_t>(fromAbove <= fromCorner ? above : corner);
}

// Processes a whole pixel at a time, so that the previous one stays in a register.
template <size_t kBytes>
void UndoSub(uint8_t* row, size_t size) {
  uint8_t left[kBytes] = {};
  for (size_t i = 0; i + kBytes <= size; i += kBytes) {
    for (size_t k = 0; k < kBytes; ++k)
      left[k] = row[i + k] = static_cast<uint8_t>(row[i + k] + left[k]);
  }
}

template <size_t kBytes>
void UndoAverage(uint8_t* row, const uint8_t* above, size_t size) {
  uint8_t left[kBytes] = {};
  for (size_t i = 0; i + kBytes <= size; i += kBytes) {
    for (size_t k = 0; k < kBytes; ++k) {
      left[k] = row[i + k] = static_cast<uint8_t>(row[i + k] + (left[k] + above[i + k]) / 2);
    }
  }
}

template <size_t kBytes>
void UndoPaeth(uint8_t* row, const uint8_t* above, size_t size) {
  uint8_t left[kBytes] = {}, corner[kBytes] = {};
  for (size_t i = 0; i + kBytes <= size; i += kBytes) {
    for (size_t k = 0; k < kBytes; ++k) {
      left[k] = row[i + k] =
          static_cast<uint8_t>(row[i + k] + Nearest(left[k], above[i + k], corner[k]));
      corner[k] = above[i + k];
    }
  }
}

void UndoUp(uint8_t* row, const uint8_t* above, size_t size) {
  for (size_t i = 0; i < size; ++i) row[i] = static_cast<uint8_t>(row[i] + above[i]);
}

template <size_t kBytes>
void UndoOf(PngFilter filter, uint8_t* row, const uint8_t* above, size_t size) {
  if (filter == PngFilter::Sub) UndoSub<kBytes>(row, size);
  if (filter == PngFilter::Average) UndoAverage<kBytes>(row, above, size);
  if (filter == PngFilter::Paeth) UndoPaeth<kBytes>(row, above, size);
}

// Each writes a filtered row and returns the sum of the absolute values, as signed bytes.
struct FilterKernels {
  uint64_t (*none)(const uint8_t* row, size_t size);
  // also used for Up
  uint64_t (*sub)(const uint8_t* row, const uint8_t* left, size_t size, uint8_t* target);
  uint64_t (*average)(const uint8_t* row, const uint8_t* left, const uint8_t* above, size_t size,
                      uint8_t* target);
  uint64_t (*paeth)(const uint8_t* row, const uint8_t* left, const uint8_t* above,
                    const uint8_t* corner, size_t size, uint8_t* target);
};

namespace baseline {
#include "formats/png/png_filter_kernels.inc"
}  // namespace baseline

#if VECTOR_HAS_AVX2
VECTOR_AVX2_BEGIN
namespace avx2 {
#include "formats/png/png_filter_kernels.inc"

inline __m128i LoadPixel(const uint8_t* source) {
  int32_t bytes;
  std::memcpy(&bytes, source, sizeof bytes);
  return _mm_cvtepu8_epi16(_mm_cvtsi32_si128(bytes));
}

// Pixels of 3 or 4 bytes, one 16-bit lane per byte. Stores more than one pixel; the bytes after it
// are loaded before.
template <size_t kBytes>
void UndoPaeth(uint8_t* row, const uint8_t* above, size_t size) {
  __m128i left = _mm_setzero_si128(), corner = left, next = LoadPixel(row);
  for (size_t i = 0; i + kBytes <= size; i += kBytes) {
    const __m128i up = LoadPixel(above + i), difference = next;
    next = LoadPixel(row + i + kBytes);
    const __m128i down = _mm_sub_epi16(up, corner), across = _mm_sub_epi16(left, corner);
    const __m128i fromLeft = _mm_abs_epi16(down), fromAbove = _mm_abs_epi16(across);
    const __m128i fromCorner = _mm_abs_epi16(_mm_add_epi16(down, across));
    const __m128i least = _mm_min_epi16(fromCorner, _mm_min_epi16(fromLeft, fromAbove));
    const __m128i second = _mm_blendv_epi8(corner, up, _mm_cmpeq_epi16(least, fromAbove));
    const __m128i nearest = _mm_blendv_epi8(second, left, _mm_cmpeq_epi16(least, fromLeft));
    left = _mm_add_epi8(difference, nearest);
    corner = up;
    const int32_t bytes = _mm_cvtsi128_si32(_mm_packus_epi16(left, left));
    std::memcpy(row + i, &bytes, i + 2 * kBytes <= size ? sizeof bytes : kBytes);
  }
}
}  // namespace avx2
VECTOR_AVX2_END
#endif

const FilterKernels& Kernels() {
#if VECTOR_HAS_AVX2
  if (platform::HasAvx2()) return avx2::kKernels;
#endif
  return baseline::kKernels;
}

bool UndoPaethFast(uint8_t* row, const uint8_t* above, size_t size, size_t pixelBytes) {
#if VECTOR_HAS_AVX2
  if (!platform::HasAvx2() || (pixelBytes != 3 && pixelBytes != 4)) return false;
  (pixelBytes == 3 ? avx2::UndoPaeth<3> : avx2::UndoPaeth<4>)(row, above, size);
  return true;
#else
  return false;
#endif
}

}  // namespace

bool UndoPngFilter(uint8_t number, uint8_t* row, const uint8_t* above, size_t size,
                   size_t pixelBytes) {
  const auto filter = static_cast<PngFilter>(number);
  if (filter > PngFilter::Paeth) return false;
  if (filter == PngFilter::Up) UndoUp(row, above, size);
  if (filter == PngFilter::Paeth && UndoPaethFast(row, above, size, pixelBytes)) return true;
  switch (pixelBytes) {
    case 1: UndoOf<1>(filter, row, above, size); return true;
    case 2: UndoOf<2>(filter, row, above, size); return true;
    case 3: UndoOf<3>(filter, row, above, size); return true;
    case 4: UndoOf<4>(filter, row, above, size); return true;
    case 6: UndoOf<6>(filter, row, above, size); return true;
    case 8: UndoOf<8>(filter, row, above, size); return true;
    default: return false;
  }
}

void PngFilterChooser::FilterRow(const uint8_t* row, const uint8_t* above, uint8_t* target) {
  const FilterKernels& kernels = Kernels();
  const size_t head = std::min(pixelBytes_, size_), rest = size_ - head;
  const uint8_t* body = row + head;
  const uint8_t* aboveBody = above + head;
  uint64_t least = kernels.none(row, size_);
  auto filter = PngFilter::None;
  const auto keep = [&](PngFilter candidate, uint64_t sum) {
    if (sum >= least) return;
    least = sum;
    filter = candidate;
    tried_.swap(best_);
  };
  // The first pixel has no left neighbor: there Sub is the value itself, Average uses half of the
  // byte above, and Paeth the byte above.
  const auto sumHead = [&](auto predict) {
    uint64_t sum = 0;
    for (size_t i = 0; i < head; ++i) {
      tried_[i] = static_cast<uint8_t>(row[i] - predict(i));
      sum += tried_[i] < 128 ? tried_[i] : 256u - tried_[i];
    }
    return sum;
  };
  uint64_t sum = sumHead([](size_t) { return 0; });
  keep(PngFilter::Sub, sum + kernels.sub(body, row, rest, tried_.data() + head));
  keep(PngFilter::Up, kernels.sub(row, above, size_, tried_.data()));
  sum = sumHead([&](size_t i) { return above[i] / 2; });
  keep(PngFilter::Average, sum + kernels.average(body, row, aboveBody, rest, tried_.data() + head));
  sum = sumHead([&](size_t i) { return above[i]; });
  keep(PngFilter::Paeth,
       sum + kernels.paeth(body, row, aboveBody, above, rest, tried_.data() + head));
  *target = static_cast<uint8_t>(filter);
  std::memcpy(target + 1, filter == PngFilter::None ? row : best_.data(), size_);
}

}  // namespace fotomill
