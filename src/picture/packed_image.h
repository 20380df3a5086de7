#pragma once

#include <cstdint>
#include <span>

#include "core/status.h"
#include "picture/palette.h"
#include "platform/memory.h"

namespace fotomill {

// The in-memory depth of a picture of `bitsPerPixel`: 1, 4 (from 2), 8 (from 5) or 24 bits.
constexpr int32_t NormalizedDepth(int32_t bitsPerPixel) {
  if (bitsPerPixel == 1) return 1;
  if (bitsPerPixel >= 2 && bitsPerPixel <= 4) return 4;
  if (bitsPerPixel >= 5 && bitsPerPixel <= 8) return 8;
  return 24;
}

// Bytes per row of `width` pixels of `bits`, padded to a multiple of 4.
constexpr uint64_t RowStride(int32_t width, int32_t bits) {
  return (static_cast<uint64_t>(width) * static_cast<uint64_t>(bits) + 31) / 32 * 4;
}

// A device-independent bitmap in one block:
//
//   offset size            content, little-endian
//        0    4            header size, 40
//        4    4            width
//        8    4            height, positive: rows are stored bottom row first
//       12    2            planes, 1
//       14    2            bits per pixel: 1, 4, 8 or 24
//       16    4            compression, 0
//       20    4            bytes of all rows
//       24    8            two resolutions, 0
//       32    8            colors used and important: 2, 16, 256, or 0 for 24 bits
//       40    4 x colors  blue, green, red, 0
//        .    rows         each padded to a multiple of 4 bytes; 24-bit pixels are blue, green, red
//
// Pixels of less than 8 bits are packed from the most significant bit down. The object owns the
// block.
class PackedImage {
 public:
  static constexpr uint64_t kHeaderSize = 40;

  bool Empty() const { return block_.Empty(); }  // no block, no picture
  void Free() { *this = PackedImage(); }  // frees the memory; empty afterwards

  int32_t Width() const { return width_; }  // pixels
  int32_t Height() const { return height_; }  // rows
  int32_t Bits() const { return bits_; }  // per pixel: 1 to 8, or 24
  // Entries of the color table, 0 for 24 bits.
  int32_t Colors() const { return bits_ == 24 ? 0 : 1 << bits_; }
  uint64_t Stride() const { return stride_; }  // bytes

  // Row y from the top, and row r in stored order, from the bottom; `stride` bytes each.
  std::span<uint8_t> Row(int32_t y) { return StoredRow(height_ - 1 - y); }
  std::span<const uint8_t> Row(int32_t y) const { return StoredRow(height_ - 1 - y); }
  std::span<uint8_t> StoredRow(int32_t r) {
    return Rows().subspan(static_cast<uint64_t>(r) * stride_, stride_);
  }
  std::span<const uint8_t> StoredRow(int32_t r) const {
    return Rows().subspan(static_cast<uint64_t>(r) * stride_, stride_);
  }
  // All rows in stored order.
  std::span<uint8_t> Rows() { return block_.Bytes().subspan(RowsOffset()); }
  std::span<const uint8_t> Rows() const { return block_.Bytes().subspan(RowsOffset()); }
  // The whole block, as laid out above.
  std::span<const uint8_t> Bytes() const { return block_.Bytes(); }
  // The color table: Colors() entries of blue, green, red, 0.
  std::span<uint8_t> ColorTable() {
    return block_.Bytes().subspan(kHeaderSize, RowsOffset() - kHeaderSize);
  }
  // Blue, green, red, 0 for each color.
  std::span<const uint8_t> ColorTable() const {
    return block_.Bytes().subspan(kHeaderSize, RowsOffset() - kHeaderSize);
  }

  // The value at column x, row y from the top: a palette index, or 0x00RRGGBB for 24 bits; -1
  // outside the picture.
  int32_t PixelAt(int32_t x, int32_t y) const;

 private:
  friend Status NewPackedImage(int32_t, int32_t, const Palette*, int32_t, PackedImage&,
                               platform::Fill);
  uint64_t RowsOffset() const { return kHeaderSize + 4 * static_cast<uint64_t>(Colors()); }

  platform::MemoryBlock block_;
  int32_t width_ = 0, height_ = 0, bits_ = 0;
  uint64_t stride_ = 0;
};

// Checks a picture's size without allocating: Ok, DamagedFile if width or height is below 1,
// MemoryAllocationError if the block would exceed the limit.
Status CheckPackedSize(int32_t width, int32_t height, int32_t bitsPerPixel);

// Bytes of the rows of such a picture, without the header.
constexpr uint64_t PackedRowBytes(int32_t width, int32_t height, int32_t bitsPerPixel) {
  return RowStride(width, NormalizedDepth(bitsPerPixel)) * static_cast<uint64_t>(height);
}
// Checks the peak memory needed for one file against the limit: MemoryAllocationError (6) if it is
// exceeded. Codecs call it with what the header implies, their library's memory included, before
// allocating anything.
Status CheckFileMemory(uint64_t bytes);

// Allocates a picture at the normalized depth of `bitsPerPixel`, its color table filled from
// `palette` (zero if null) and its rows zero; with Fill::Unset the rows are uninitialized, for
// callers that write every byte of them, padding included. DamagedFile if width or height is
// below 1, MemoryAllocationError if the block exceeds the limit or cannot be allocated; `image`
// is empty then.
Status NewPackedImage(int32_t width, int32_t height, const Palette* palette, int32_t bitsPerPixel,
                      PackedImage& image, platform::Fill fill = platform::Fill::Zero);

// An alpha plane: an 8-bit image with the gray ramp as its palette, values from 0 (transparent) to
// 255 (opaque). Statuses as NewPackedImage.
Status NewAlphaPlane(int32_t width, int32_t height, PackedImage& plane,
                     platform::Fill fill = platform::Fill::Zero);

}  // namespace fotomill
