#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// The contents of a Photoshop document, as views
// into the file. For the layout see psd_file.cpp.

// Color modes, numbered as in the file header.
enum class PsdMode : uint16_t {
  Bitmap = 0,
  Gray = 1,
  Indexed = 2,
  Rgb = 3,
  Cmyk = 4,
  Multichannel = 7,
  Duotone = 8,
  Lab = 9
};

// Numbers of the resources used here.
enum class PsdResource : uint16_t {
  Resolution = 1005,
  ChannelInfo = 1007,  // for channels after those of the mode
  IccProfile = 1039,
  TransparentIndex = 1047,
  VersionInfo = 1057,
  Exif = 1058,
  Xmp = 1060,
  ChannelInfoNew = 1077,
};

inline constexpr int32_t kLongestPsdSide = 30000;  // pixels

// The file header.
struct PsdHeader {
  uint16_t channels = 0;
  int32_t width = 0, height = 0;
  uint16_t depth = 8;  // bits per sample: 1, 8 or 16
  PsdMode mode = PsdMode::Rgb;

  // Bytes per row of a channel that is `width` samples wide.
  size_t RowSize(size_t samples) const { return (samples * depth + 7) / 8; }
};

// Special channel numbers of layers.
inline constexpr int16_t kPsdTransparency = -1;

// One channel of a layer.
struct PsdChannel {
  int16_t number = 0;             // 0 and up: colors, kPsdTransparency, -2 and below: masks
  std::span<const uint8_t> data;  // compression, 2 bytes, then the rows
};

// One layer.
struct PsdLayer {
  int32_t top = 0, left = 0, bottom = 0, right = 0;  // on the canvas, may extend beyond it
  std::vector<PsdChannel> channels;

  // Null if the layer has no channel with that number.
  const PsdChannel* Channel(int16_t number) const;
};

// The parts of a file.
struct PsdFile {
  PsdHeader header;
  // of an indexed picture: 256 reds, greens, blues
  std::span<const uint8_t> colorTable;
  std::span<const uint8_t> icc, exif, xmp;
  double dpiX = 0, dpiY = 0;       // 0 if unknown
  int32_t transparentIndex = -1;   // of an indexed picture; -1 if none
  bool firstExtraIsInk = false;    // the channel after those of the mode is a spot color
  bool mergedIsReal = true;        // contains the composite of all layers, instead of being blank
  // the channel after those of the mode is its opacity, and its colors are composited onto white
  bool mergedHasOpacity = false;
  size_t layerCount = 0;           // all layers in the file
  std::vector<PsdLayer> layers;    // those with pixels, from the bottom up
  // compression, 2 bytes, then the rows; empty if there is none
  std::span<const uint8_t> merged;
};

// Number of color channels of a picture in that mode: 1, 3 or 4.
uint16_t PsdColorChannels(const PsdHeader& header);

// DamagedFile, FileReadError, UnsupportedFormat as in psd.h.
Status ParsePsd(std::span<const uint8_t> file, PsdFile& document);

}  // namespace fotomill
