#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "formats/tiff/tiff_lab.h"
#include "formats/tiff/tiff_layout.h"
#include "picture/packed_image.h"
#include "picture/palette.h"

namespace fotomill {

// The images a page is decoded into, of the page's size; `alpha` is empty if it has none.
struct TiffTarget {
  PackedImage image, alpha;
};

// Converts decoded rows of a page; not for TiffRows::Library.
class TiffConverter {
 public:
  // All three must outlive it.
  TiffConverter(const TiffLayout& layout, const Palette& palette, TiffTarget& target);

  // Stores row `y` from the top. `row` has interleaved samples as in the file, or the first
  // sample's row followed by the others, `planeStride` bytes apart (0 if interleaved).
  void Store(int32_t y, const uint8_t* row, size_t planeStride);

 private:
  const uint8_t* AsBytes(const uint8_t* row, size_t planeStride);
  void StoreColors(const uint8_t* samples, uint8_t* image);
  void StoreAlpha(const uint8_t* samples, uint8_t* image, uint8_t* alpha) const;

  const TiffLayout& layout_;
  const Palette& palette_;
  TiffTarget& target_;
  std::vector<uint8_t> bytes_;  // one row's samples
  std::optional<TiffLab> lab_;
};

}  // namespace fotomill
