#pragma once

#include <cstdint>
#include <map>
#include <span>
#include <vector>

#include "containers/compound_file.h"
#include "core/status.h"

namespace fotomill {

// The structure of a FlashPix file. For the layout see fpx_file.cpp.

// Color spaces by number.
enum class FpxColors : uint8_t { Gray = 1, PhotoYcc = 2, Rgb = 3 };

// Position and encoding of a tile's pixels.
struct FpxTile {
  uint64_t offset = 0, size = 0;  // of its data in the tile stream
  uint32_t compression = 0;       // 0 none, 1 one color, 2 JPEG
  // single color: its channels; JPEG, from the lowest byte: interleaving, chroma subsampling, 1 if
  // converted to YCbCr, and the number of its tables
  uint32_t subtype = 0;
};

// One of the stored resolutions.
struct FpxSize {
  int32_t width = 0, height = 0;
  int32_t tileWidth = 64, tileHeight = 64;
  int32_t channels = 1;
  FpxColors colors = FpxColors::Gray;
  bool opacity = false;  // the last channel is opacity; colors are premultiplied
  std::vector<FpxTile> tiles;
  CompoundStream data;

  int32_t TilesAcross() const {
    return (width + tileWidth - 1) / tileWidth;
  }  // the last may be cut
  int32_t TilesDown() const { return (height + tileHeight - 1) / tileHeight; }
};

// The picture of a file, stored in up to 32 resolutions.
class FpxFile {
 public:
  // `file` must outlive this object.
  Status Open(std::span<const uint8_t> file);
  int32_t Sizes() const { return sizes_; }  // at least 1 after Open
  int32_t Width() const { return width_; }  // of the largest resolution
  int32_t Height() const { return height_; }  // pixels
  // Whether a view rotates or changes the picture; not applied.
  bool HasTransform() const { return transform_; }
  // Resolution `index`, smallest first; tiles are read only if `withTiles`.
  Status ReadSize(int32_t index, bool withTiles, FpxSize& size) const;
  // The JPEG tables with that number; empty if there are none.
  std::span<const uint8_t> JpegTables(uint32_t number) const;

 private:
  Status ParseContents();

  CompoundFile compound_;
  int32_t store_ = CompoundFile::kNone;
  std::vector<uint8_t> contents_;
  std::map<uint32_t, std::span<const uint8_t>> properties_;  // type and value
  int32_t sizes_ = 0, width_ = 0, height_ = 0;
  bool transform_ = false;
};

}  // namespace fotomill
