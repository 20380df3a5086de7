#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"

namespace fotomill {

// Color format of an HD Photo codestream.
enum class HdpColors : uint8_t {
  Gray = 0,
  Yuv420 = 1,
  Yuv422 = 2,
  Yuv444 = 3,
  Cmyk = 4,
  CmykDirect = 5,
  Channels = 6,
  Rgb = 7,
  Rgbe = 8
};
// Sample format of a channel.
enum class HdpDepth : uint8_t {
  WhiteIsOne = 0,
  U8 = 1,
  U16 = 2,
  Fixed16 = 3,
  Half = 4,
  U32 = 5,
  Fixed32 = 6,
  Float = 7,
  Rgb555 = 8,
  Rgb101010 = 9,
  Rgb565 = 10,
  BlackIsOne = 15,
};

// The parts of a codestream's header that are needed before decoding.
struct HdpStream {
  std::span<const uint8_t> bytes;
  int32_t width = 0, height = 0;
  HdpColors colors = HdpColors::Gray;
  HdpDepth depth = HdpDepth::U8;
  bool alpha = false;           // interleaved alpha plane
  bool multiplied = false;      // premultiplied alpha
  bool frequencyOrder = false;  // low frequencies of the whole picture first
  uint8_t overlap = 0;          // 0 to 2: smoothing between blocks
  uint32_t tiles = 1;
  bool lossless = false;       // every quantizer is 1
  // internal color format: 0 gray, 1 4:2:0, 2 4:2:2, 3 4:4:4, 4 CMYK, 6 any channels
  uint8_t internalColors = 0;
};

// Parses a codestream's header and checks what a decoder would trust. FileReadError if truncated,
// DamagedFile if invalid.
Status ParseHdpStream(std::span<const uint8_t> bytes, HdpStream& stream);

// One picture of a file. Spans point into the file.
struct HdpPage {
  HdpStream image;
  HdpStream alpha;        // separate codestream, empty if there is none
  bool cutShort = false;  // the file is truncated within the codestreams
  std::array<uint8_t, 16> pixelFormat{};
  // 0 to 7: rotate by 90 degrees clockwise (4), then flip columns (2) and rows (1)
  uint32_t turn = 0;
  float dpiX = 0, dpiY = 0;
  std::span<const uint8_t> icc, xmp, description;
  uint64_t directory = 0;  // offset of the page's directory, which may refer to those of EXIF
};

// Converts a rotation value to an EXIF orientation, 1 to 8, and back.
uint16_t OrientationOfTurn(uint32_t turn);
uint32_t HdpTurn(uint16_t orientation);  // the rotation value of an EXIF orientation

inline constexpr int32_t kMostHdpPages = 4096;  // further pages are ignored

// The number of pages, 0 if the file is not HD Photo.
int32_t CountHdpPages(std::span<const uint8_t> file);

// Parses the directory of a page, from 0, and its codestreams' headers. NoImages if it does not
// exist; else as above.
Status ParseHdpPage(std::span<const uint8_t> file, int32_t page, HdpPage& result);

// The EXIF block of a parsed page: a camera's directories, and the rotation as orientation.
// May be empty.
std::vector<uint8_t> HdpExifBlock(std::span<const uint8_t> file, const HdpPage& page);

// Directory entries used by both reader and writer.
inline constexpr uint16_t kHdpDescription = 270, kHdpXmp = 700, kHdpIcc = 34675, kHdpExif = 34665,
                          kHdpGps = 34853;
inline constexpr uint16_t kHdpPixelFormat = 0xBC01, kHdpOrientation = 0xBC02, kHdpWidth = 0xBC80,
                          kHdpHeight = 0xBC81, kHdpDpiX = 0xBC82, kHdpDpiY = 0xBC83,
                          kHdpImageOffset = 0xBCC0, kHdpImageSize = 0xBCC1,
                          kHdpAlphaOffset = 0xBCC2, kHdpAlphaSize = 0xBCC3;
inline constexpr uint16_t kHdpByte = 1, kHdpText = 2, kHdpLong = 4, kHdpUndefined = 7,
                          kHdpFloat = 11;

}  // namespace fotomill
