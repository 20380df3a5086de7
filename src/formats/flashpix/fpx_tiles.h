#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "formats/flashpix/fpx_file.h"
#include "formats/jpeg/jpeg_library.h"

namespace fotomill {

// Decodes the tiles of one size, one after the other, to rows as an image has them.
class FpxTileDecoder {
 public:
  // Both must stay.
  FpxTileDecoder(const FpxFile& file, const FpxSize& size);

  // DamagedFile, FileReadError when the data are not all there, UnsupportedFormat for another
  // compression.
  Status Decode(const FpxTile& tile);
  // Row `y` of the tile that was decoded last: grays, or blue, green, red; and its opacities.
  std::span<const uint8_t> Pixels(int32_t y) const;
  std::span<const uint8_t> Opacities(int32_t y) const;

 private:
  Status Copy(const FpxTile& tile);
  void Fill(uint32_t color);
  Status DecodeJpeg(const FpxTile& tile);
  void ToPixels(bool fromYcc);
  void Divide();

  const FpxFile& file_;
  const FpxSize& size_;
  const size_t width_, height_, channels_, colors_;
  std::vector<uint8_t> samples_;  // as stored, channel by channel in each pixel
  std::vector<uint8_t> pixels_, opacities_;
  std::vector<uint8_t> gathered_;
  JpegReader reader_;
  bool created_ = false;
  uint32_t tables_ = 0;  // whose number is in force
};

}  // namespace fotomill
