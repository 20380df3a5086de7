#pragma once

#include <algorithm>
#include <cstdint>
#include <span>
#include <vector>

#include "core/byte_reader.h"
#include "core/byte_writer.h"
#include "core/status.h"
#include "picture/palette.h"
#include "platform/memory.h"

namespace fotomill {

// The blocks of a GIF file; for the layout see gif.cpp.
namespace gif {
inline constexpr uint8_t kPictureBlock = 0x2C, kExtensionBlock = 0x21, kEndBlock = 0x3B;
// Extension labels.
inline constexpr uint8_t kGraphicControl = 0xF9, kComment = 0xFE, kApplication = 0xFF;
inline constexpr int32_t kNoIndex = -1;  // of a frame without a transparent color

// What to do with a frame before the next one is drawn.
enum Disposal : uint8_t { kKeep = 1, kToBackground = 2, kToPrevious = 3 };
}  // namespace gif

// A palette in the file.
struct GifPalette {
  std::span<const uint8_t> colors;  // red, green, blue
  int32_t bits = 0;                 // 2^bits entries; 0: no palette
};

// The logical screen, on which frames are composed.
struct GifScreen {
  bool is89 = false;
  int32_t width = 0, height = 0;
  GifPalette palette;
};

// One frame: its position on the screen, and its pixel encoding.
struct GifFrame {
  int32_t left = 0, top = 0, width = 0, height = 0;
  bool interlaced = false;
  GifPalette palette;  // local, else global
  int32_t transparent = gif::kNoIndex;
  uint8_t disposal = 0;
  uint16_t delay = 0;       // hundredths of a second
  uint64_t dataOffset = 0;  // of the LZW data
  uint8_t pixelBits = 0;    // from the LZW data

  // Bits per pixel of this frame as a picture. Two-color frames are coded with 2 bits.
  int32_t Depth() const {
    if (palette.bits == 0) return std::clamp<int32_t>(pixelBits, 1, 8);
    return palette.bits == 1 && pixelBits <= 2
               ? 1
               : std::clamp<int32_t>(std::max<int32_t>(palette.bits, pixelBits), 1, 8);
  }
  // Whether it covers the whole screen.
  bool Covers(const GifScreen& screen) const {
    return left == 0 && top == 0 && width >= screen.width && height >= screen.height;
  }
};

// Data from extension blocks.
struct GifRemarks {
  std::vector<uint8_t> comment;
  bool loops = false;
  uint16_t repeats = 0;  // if looping: number of repetitions, 0 for endless
};

// DamagedFile without the signature, FileReadError if the header is truncated.
Status ParseScreen(ByteReader& bytes, GifScreen& screen);
// Advances to the LZW data of the next frame. NoImages if the file ends properly before one,
// FileReadError if it is truncated.
Status NextFrame(ByteReader& bytes, GifScreen& screen, GifFrame& frame,
                 GifRemarks* remarks = nullptr);
// Skips the LZW data of a frame.
void SkipFrame(ByteReader& bytes);

// Writes a comment block, or nothing if the comment is empty.
void WriteGifComment(ByteWriter& out, std::span<const uint8_t> comment);

// The palette of a frame, a gray ramp if the file has none.
void TakeColors(const GifFrame& frame, Palette& palette);
// The row stored at position `r` of an interlaced picture.
int32_t InterlacedRow(int32_t r, int32_t height);
// The indices of a frame in file order; the reader is left after it. FileReadError, before
// allocating memory, if the data are too short for that many. With `done`, which receives the
// number decoded, it is only returned after decoding all available pixels; the rest are 0.
Status DecodeFrame(ByteReader& bytes, const GifFrame& frame, platform::MemoryBlock& pixels,
                   uint64_t* done = nullptr);

}  // namespace fotomill
