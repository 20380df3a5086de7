#pragma once

#include <cstdint>
#include <map>
#include <span>
#include <vector>

#include "containers/compound_file.h"
#include "core/status.h"

namespace fotomill {

// What of a FlashPix file describes its pictures. The layout is described in fpx_file.cpp.

enum class FpxColors : uint8_t { Gray = 1, PhotoYcc = 2, Rgb = 3 };

struct FpxTile {
  uint64_t offset = 0, size = 0;  // of its data in the stream of tiles
  uint32_t compression = 0;       // 0 none, 1 one color, 2 JPEG
  // of one color: its channels; of JPEG, from the lowest byte: interleaving, sampling of the
  // chromas, 1 where the colors were turned to YCbCr, and the number of its tables
  uint32_t subtype = 0;
};

// One of the sizes that a picture is stored in.
struct FpxSize {
  int32_t width = 0, height = 0;
  int32_t tileWidth = 64, tileHeight = 64;
  int32_t channels = 1;
  FpxColors colors = FpxColors::Gray;
  bool opacity = false;  // is the last channel; colors are multiplied with it
  std::vector<FpxTile> tiles;
  CompoundStream data;

  int32_t TilesAcross() const { return (width + tileWidth - 1) / tileWidth; }
  int32_t TilesDown() const { return (height + tileHeight - 1) / tileHeight; }
};

class FpxFile {
 public:
  // `file` must stay.
  Status Open(std::span<const uint8_t> file);
  int32_t Sizes() const { return sizes_; }
  int32_t Width() const { return width_; }  // of the largest size
  int32_t Height() const { return height_; }
  // Whether a view of the picture turns or changes it, which is not done.
  bool HasTransform() const { return transform_; }
  // Size `index` from the smallest; the tiles only if `withTiles`.
  Status ReadSize(int32_t index, bool withTiles, FpxSize& size) const;
  // The JPEG tables of that number; empty without any.
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
