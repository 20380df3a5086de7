#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace fotomill {

// Converts 8-bit CIE L*a*b* samples, white point D50, to sRGB.
class TiffLab {
 public:
  // `signedColors`: a* and b* are signed (CIELAB), else 128 is neutral (ICCLAB).
  explicit TiffLab(bool signedColors);
  ~TiffLab();
  TiffLab(const TiffLab&) = delete;
  TiffLab& operator=(const TiffLab&) = delete;

  // Converts a row of `width` pixels, with `step` samples each, to blue, green, red; to gray by L*
  // alone if memory runs out.
  void StoreRow(const uint8_t* samples, size_t step, size_t width, uint8_t* image);

 private:
  void* transform_;  // the library's, owned
  uint8_t flip_;
  std::vector<uint8_t> row_;
};

}  // namespace fotomill
