#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// Pixels in printing inks or in CIE Lab as sRGB.
class InkTransform {
 public:
  // Cmyk: cyan, magenta, yellow, black, 255 for no ink. Lab: lightness from 0 to 255, and two
  // values with 128 for none.
  enum class Kind { Cmyk, Lab };

  // `profile` says how inks look, by its perceptual intent. Without one, and with one that is
  // damaged or of other colors, light passes through one ink after the other.
  InkTransform(Kind kind, std::span<const uint8_t> profile);
  ~InkTransform();
  InkTransform(const InkTransform&) = delete;
  InkTransform& operator=(const InkTransform&) = delete;

  // `samples` has four bytes a pixel, or three of Lab; `bgr` gets blue, green, red.
  void Apply(const uint8_t* samples, size_t count, uint8_t* bgr) const;

 private:
  void* transform_ = nullptr;  // the library's; null for the formula
};

}  // namespace fotomill
