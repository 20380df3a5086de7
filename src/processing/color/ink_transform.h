#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace fotomill {

// Converts CMYK or CIE Lab pixels to sRGB.
class InkTransform {
 public:
  // Cmyk: cyan, magenta, yellow, black, 255 for no ink. Lab: lightness from 0 to 255, and a and b
  // with 128 for neutral.
  enum class Kind { Cmyk, Lab };

  // Uses the perceptual intent of `profile`. Without a valid one for these colors, inks are treated
  // as a stack of ideal filters.
  InkTransform(Kind kind, std::span<const uint8_t> profile);
  ~InkTransform();
  InkTransform(const InkTransform&) = delete;
  InkTransform& operator=(const InkTransform&) = delete;

  // `samples` has four bytes per pixel, for Lab three; `bgr` receives blue, green, red.
  void Apply(const uint8_t* samples, size_t count, uint8_t* bgr) const;

 private:
  void* transform_ = nullptr;  // the library's handle; null: use the formula
};

}  // namespace fotomill
