#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace fotomill {

// Turns CIE L*a*b* samples of one byte, white point D50, into sRGB.
class TiffLab {
 public:
  // `signedColors`: a* and b* are signed (CIELAB), else 128 stands for none (ICCLAB).
  explicit TiffLab(bool signedColors);
  ~TiffLab();
  TiffLab(const TiffLab&) = delete;
  TiffLab& operator=(const TiffLab&) = delete;

  // A row of `width` pixels, `step` samples each, to blue, green, red; gray by L* alone when there
  // is no memory.
  void StoreRow(const uint8_t* samples, size_t step, size_t width, uint8_t* image);

 private:
  void* transform_;  // of the library, owned
  uint8_t flip_;
  std::vector<uint8_t> row_;
};

}  // namespace fotomill
