#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// What a Photoshop document holds, as views into the file. The file layout is described in
// psd_file.cpp.

// Color modes of a Photoshop file, by the numbers of its header.
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

// Numbers of the resources that matter here.
enum class PsdResource : uint16_t {
  Resolution = 1005,
  ChannelInfo = 1007,  // of the channels behind those of the mode
  IccProfile = 1039,
  TransparentIndex = 1047,
  VersionInfo = 1057,
  Exif = 1058,
  Xmp = 1060,
  ChannelInfoNew = 1077,
};

inline constexpr int32_t kLongestPsdSide = 30000;  // pixels

// What the header of a file says.
struct PsdHeader {
  uint16_t channels = 0;
  int32_t width = 0, height = 0;
  uint16_t depth = 8;  // bits of a sample: 1, 8 or 16
  PsdMode mode = PsdMode::Rgb;

  // Bytes of a row of one channel that is `width` samples wide.
  size_t RowSize(size_t samples) const { return (samples * depth + 7) / 8; }
};

// Numbers of channels of a layer.
inline constexpr int16_t kPsdTransparency = -1;

// One channel of a layer, and where its data are.
struct PsdChannel {
  int16_t number = 0;             // from 0 the colors, kPsdTransparency, -2 and below masks
  std::span<const uint8_t> data;  // a compression, 2 bytes, and the rows
};

// One layer, with its place in the picture.
struct PsdLayer {
  int32_t top = 0, left = 0, bottom = 0, right = 0;  // on the canvas, which it may leave
  std::vector<PsdChannel> channels;

  // Null when the layer has none of that number.
  const PsdChannel* Channel(int16_t number) const;
};

// The parts of a file.
struct PsdFile {
  PsdHeader header;
  // of an indexed picture: 256 reds, then the greens, then the blues
  std::span<const uint8_t> colorTable;
  std::span<const uint8_t> icc, exif, xmp;
  double dpiX = 0, dpiY = 0;       // 0 when the file does not say
  int32_t transparentIndex = -1;   // of an indexed picture; -1 none
  bool firstExtraIsInk = false;    // the channel behind those of the mode is a spot color
  bool mergedIsReal = true;        // the program stored a picture of all layers, not an empty one
  // the channel behind those of the mode is its opacity, and its colors lie on white
  bool mergedHasOpacity = false;
  size_t layerCount = 0;           // all that the file tells of
  std::vector<PsdLayer> layers;    // those that hold pixels, from the bottom up
  // a compression, 2 bytes, and the rows; empty when there is none
  std::span<const uint8_t> merged;
};

// How many channels a picture of that mode is made of: 1, 3 or 4.
uint16_t PsdColorChannels(const PsdHeader& header);

// DamagedFile, FileReadError, UnsupportedFormat as in psd.h.
Status ParsePsd(std::span<const uint8_t> file, PsdFile& document);

}  // namespace fotomill
