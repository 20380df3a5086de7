#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace fotomill {

// PNG rows are stored as differences from a prediction: the pixel to the left, above, their mean,
// or that of left, above and above left which is closest to left + above - above left.
// `pixelBytes` is the size of a whole pixel, at least 1. Source: PNG (third edition), section 9.
enum class PngFilter : uint8_t { None, Sub, Up, Average, Paeth };

// Bytes after a row that UndoPngFilter may read, and which must be readable.
inline constexpr size_t kPngSlack = 8;

// Unfilters a row in place. `above` is the previous row, of the same size, zeros for the first one.
// False for an invalid filter.
[[nodiscard]] bool UndoPngFilter(uint8_t filter, uint8_t* row, const uint8_t* above, size_t size,
                                 size_t pixelBytes);

// Chooses the filter for each row that minimizes the sum of absolute differences.
class PngFilterChooser {
 public:
  // Rows of `size` bytes, pixels of `pixelBytes`.
  PngFilterChooser(size_t size, size_t pixelBytes)
      : size_(size), pixelBytes_(pixelBytes), tried_(size), best_(size) {}
  // Writes the filter type and the filtered row to `target`, 1 + size bytes.
  void FilterRow(const uint8_t* row, const uint8_t* above, uint8_t* target);

 private:
  size_t size_, pixelBytes_;
  std::vector<uint8_t> tried_, best_;
};

}  // namespace fotomill
