#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "formats/pict/pict_file.h"
#include "picture/palette.h"

namespace fotomill {

// Decodes the rows of a bitmap, top first. Not for JPEG.
class PictRowDecoder {
 public:
  explicit PictRowDecoder(const PictPixels& pixels);  // `pixels` must outlive it

  // Unpacks the next row. FileReadError if the packed row is incomplete.
  Status Next();
  // The row: indices of `bits` bits each, or blue, green, red.
  std::span<const uint8_t> Indices() const { return raw_; }
  std::span<const uint8_t> Colors();

  const Palette& Colormap() const { return palette_; }  // for Indices

 private:
  Status NextPacked();
  void SetPalette();

  const PictPixels& pixels_;
  std::span<const uint8_t> data_;
  std::vector<uint8_t> raw_;  // one unpacked row
  std::vector<uint8_t> bgr_;
  Palette palette_{};
};

}  // namespace fotomill
