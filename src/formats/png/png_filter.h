#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace fotomill {

// A PNG row is stored as differences: from the pixel to the left, the one above, the mean of both,
// or whichever of left, above and above left comes nearest to left + above - above left.
// `pixelBytes` is the size of a whole pixel, at least 1. Source: PNG (third edition), section 9.
enum class PngFilter : uint8_t { None, Sub, Up, Average, Paeth };

// Bytes behind a row that UndoPngFilter may read, and must be able to.
inline constexpr size_t kPngSlack = 8;

// Turns differences back into values, in place. `above` is the row above, as large, zeros for the
// first one. False for a filter that does not exist.
[[nodiscard]] bool UndoPngFilter(uint8_t filter, uint8_t* row, const uint8_t* above, size_t size,
                                 size_t pixelBytes);

// Chooses filters for the rows of a picture: the one with the smallest differences in sum.
class PngFilterChooser {
 public:
  // Rows of `size` bytes, pixels of `pixelBytes`.
  PngFilterChooser(size_t size, size_t pixelBytes)
      : size_(size), pixelBytes_(pixelBytes), tried_(size), best_(size) {}
  // Writes the filter's number and the filtered row to `target`, 1 + size bytes.
  void FilterRow(const uint8_t* row, const uint8_t* above, uint8_t* target);

 private:
  size_t size_, pixelBytes_;
  std::vector<uint8_t> tried_, best_;
};

}  // namespace fotomill
