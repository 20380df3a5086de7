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

// The blocks of a GIF file, as laid out in gif.cpp.
namespace gif {
inline constexpr uint8_t kPictureBlock = 0x2C, kExtensionBlock = 0x21, kEndBlock = 0x3B;
// Labels of extensions.
inline constexpr uint8_t kGraphicControl = 0xF9, kComment = 0xFE, kApplication = 0xFF;
inline constexpr int32_t kNoIndex = -1;  // of a frame without a transparent color

// What becomes of a frame when its time is over.
enum Disposal : uint8_t { kKeep = 1, kToBackground = 2, kToPrevious = 3 };
}  // namespace gif

// A palette inside the file.
struct GifPalette {
  std::span<const uint8_t> colors;  // red, green, blue
  int32_t bits = 0;                 // 2^bits entries; 0: there is none
};

// The logical screen, in which the frames lie.
struct GifScreen {
  bool is89 = false;
  int32_t width = 0, height = 0;
  GifPalette palette;
};

// One frame: where it is in the screen, and how its pixels are coded.
struct GifFrame {
  int32_t left = 0, top = 0, width = 0, height = 0;
  bool interlaced = false;
  GifPalette palette;  // local, else global
  int32_t transparent = gif::kNoIndex;
  uint8_t disposal = 0;
  uint16_t delay = 0;       // hundredths of a second
  uint64_t dataOffset = 0;  // of the LZW data
  uint8_t pixelBits = 0;    // as the LZW data say

  // Bits per pixel of the picture that this frame is. Two-color frames are coded with 2 bits.
  int32_t Depth() const {
    if (palette.bits == 0) return std::clamp<int32_t>(pixelBits, 1, 8);
    return palette.bits == 1 && pixelBits <= 2
               ? 1
               : std::clamp<int32_t>(std::max<int32_t>(palette.bits, pixelBits), 1, 8);
  }
  // No other frame shows beside it.
  bool Covers(const GifScreen& screen) const {
    return left == 0 && top == 0 && width >= screen.width && height >= screen.height;
  }
};

// What is between the frames.
struct GifRemarks {
  std::vector<uint8_t> comment;
  bool loops = false;
  uint16_t repeats = 0;  // of one that loops: how often it is played again, 0 for ever
};

// DamagedFile without the signature, FileReadError when the header is cut short.
Status ParseScreen(ByteReader& bytes, GifScreen& screen);
// Moves on to the next frame, up to its LZW data. NoImages when the file ends properly before one,
// FileReadError when it is cut short.
Status NextFrame(ByteReader& bytes, GifScreen& screen, GifFrame& frame,
                 GifRemarks* remarks = nullptr);
// Passes over the LZW data of a frame.
void SkipFrame(ByteReader& bytes);

// Writes a comment block; nothing for an empty comment.
void WriteGifComment(ByteWriter& out, std::span<const uint8_t> comment);

// The palette that a frame's pixels mean, a ramp of grays where the file has none.
void TakeColors(const GifFrame& frame, Palette& palette);
// The file row that comes as number `r` of an interlaced picture.
int32_t InterlacedRow(int32_t r, int32_t height);
// The indices of a frame in the order of the file; the reader is left behind it. FileReadError
// before any memory is taken when the data cannot hold so many. With `done`, which gets how many
// there are, this happens only behind the last pixel; the rest are 0.
Status DecodeFrame(ByteReader& bytes, const GifFrame& frame, platform::MemoryBlock& pixels,
                   uint64_t* done = nullptr);

}  // namespace fotomill
