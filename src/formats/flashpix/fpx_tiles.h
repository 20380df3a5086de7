#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "formats/flashpix/fpx_file.h"
#include "formats/jpeg/jpeg_library.h"

namespace fotomill {

// Decodes the tiles of one resolution, one at a time, to rows in image layout.
class FpxTileDecoder {
 public:
  // Both must outlive this object.
  FpxTileDecoder(const FpxFile& file, const FpxSize& size);

  // DamagedFile, FileReadError if the data are truncated, UnsupportedFormat for
  // unknown compression.
  Status Decode(const FpxTile& tile);
  // Row `y` of the last decoded tile: grays, or blue, green, red; and its opacity.
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
  std::vector<uint8_t> samples_;  // as stored, channels interleaved
  std::vector<uint8_t> pixels_, opacities_;
  std::vector<uint8_t> gathered_;
  JpegReader reader_;
  bool created_ = false;
  uint32_t tables_ = 0;  // number of the current tables
};

}  // namespace fotomill
