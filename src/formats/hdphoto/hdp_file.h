#pragma once

#include <array>
#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"

namespace fotomill {

// What a pixel of an HD Photo codestream is made of.
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
// How one sample of a channel is stored.
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

// The head of a codestream, as far as a decoder must know it beforehand.
struct HdpStream {
  std::span<const uint8_t> bytes;
  int32_t width = 0, height = 0;
  HdpColors colors = HdpColors::Gray;
  HdpDepth depth = HdpDepth::U8;
  bool alpha = false;           // a plane of alpha goes with the colors
  bool multiplied = false;      // colors were multiplied by alpha
  bool frequencyOrder = false;  // coarse values of the whole picture come first, fine ones last
  uint8_t overlap = 0;          // 0 to 2: how far blocks are smoothed into each other
  uint32_t tiles = 1;
  bool lossless = false;       // every quantizer is 1
  // how the colors are coded: 0 gray, 1 4:2:0, 2 4:2:2, 3 4:4:4, 4 CMYK, 6 any channels
  uint8_t internalColors = 0;
};

// Reads the head of a codestream and checks what a decoder would trust. FileReadError when it is
// cut short, DamagedFile when it makes no sense.
Status ParseHdpStream(std::span<const uint8_t> bytes, HdpStream& stream);

// One picture of a file. The spans lie in the file.
struct HdpPage {
  HdpStream image;
  HdpStream alpha;        // a codestream of its own, without bytes when there is none
  bool cutShort = false;  // the file ends before the codestreams do
  std::array<uint8_t, 16> pixelFormat{};
  // 0 to 7: a quarter turn to the right (4), then columns (2) and rows (1) flipped
  uint32_t turn = 0;
  float dpiX = 0, dpiY = 0;
  std::span<const uint8_t> icc, xmp, description;
  uint64_t directory = 0;  // where the page's own directory is, which may lead to those of EXIF
};

// The orientation of EXIF, 1 to 8, that a turn means, and back.
uint16_t OrientationOfTurn(uint32_t turn);
uint32_t HdpTurn(uint16_t orientation);  // the library's number of an EXIF orientation

inline constexpr int32_t kMostHdpPages = 4096;  // more are not read

// The number of pages, 0 when the file is no HD Photo.
int32_t CountHdpPages(std::span<const uint8_t> file);

// Reads the directory of a page, from 0, and its codestreams' heads. NoImages when there is no such
// page; else as above.
Status ParseHdpPage(std::span<const uint8_t> file, int32_t page, HdpPage& result);

// The EXIF block of a page that was parsed: what a camera's directories say, and the turn as
// orientation. Empty when there is nothing to say.
std::vector<uint8_t> HdpExifBlock(std::span<const uint8_t> file, const HdpPage& page);

// The entries of a directory that both reader and writer know.
inline constexpr uint16_t kHdpDescription = 270, kHdpXmp = 700, kHdpIcc = 34675, kHdpExif = 34665,
                          kHdpGps = 34853;
inline constexpr uint16_t kHdpPixelFormat = 0xBC01, kHdpOrientation = 0xBC02, kHdpWidth = 0xBC80,
                          kHdpHeight = 0xBC81, kHdpDpiX = 0xBC82, kHdpDpiY = 0xBC83,
                          kHdpImageOffset = 0xBCC0, kHdpImageSize = 0xBCC1,
                          kHdpAlphaOffset = 0xBCC2, kHdpAlphaSize = 0xBCC3;
inline constexpr uint16_t kHdpByte = 1, kHdpText = 2, kHdpLong = 4, kHdpUndefined = 7,
                          kHdpFloat = 11;

}  // namespace fotomill
