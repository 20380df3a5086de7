#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "picture/palette.h"
#include "picture/rectangle.h"

namespace fotomill {

// The contents of a Paint Shop Pro image, as views into the file. For the layout see psp_file.cpp.

// Common to all channels of the file.
enum class PspCompression : uint16_t { None = 0, RunLengths = 1, Lz77 = 2, Jpeg = 3 };
enum class PspBitmap : uint16_t { Image = 0, Transparency = 1 };  // what a channel contains
// Color of a channel, Composite for all.
enum class PspColor : uint16_t { Composite = 0, Red = 1, Green = 2, Blue = 3 };

// The samples of one channel of a layer.
struct PspChannel {
  PspBitmap bitmap = PspBitmap::Image;
  PspColor color = PspColor::Composite;
  uint32_t size = 0;  // uncompressed size of all rows
  std::span<const uint8_t> data;
};

// A layer, or the composite image.
struct PspLayer {
  Rectangle place;  // on the canvas, may extend beyond it
  uint8_t opacity = 255;
  uint8_t blendMode = 0;  // 0 normal
  bool visible = true;
  int32_t bits = 24;
  PspCompression compression = PspCompression::None;
  std::vector<PspChannel> channels;

  // Null if there is no such channel.
  const PspChannel* Channel(PspBitmap bitmap, PspColor color) const;
  // Whether there are pixels: a composite channel, or the three color channels.
  bool HasPixels() const;
};

// The parsed file.
struct PspFile {
  uint16_t version = 0;  // 3 is Paint Shop Pro 5
  int32_t width = 0, height = 0;
  double dpi = 0;  // 0 if unknown
  PspCompression compression = PspCompression::None;
  int32_t bits = 24;
  bool gray = false, hasPalette = false;
  Palette palette{};
  std::vector<PspLayer> layers;  // raster layers, from the bottom up
  int32_t otherLayers = 0;       // vectors, adjustments
  PspLayer composite;            // without channels if there is none
};

// FileReadError, DamagedFile.
Status ParsePsp(std::span<const uint8_t> file, PspFile& psp);

}  // namespace fotomill
