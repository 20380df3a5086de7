#pragma once

#include <array>
#include <cstdint>

#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "platform/memory.h"

namespace fotomill {

// The rows of an image of any depth as 24-bit pixels. The image must outlive the reader and keep
// its block.
class BgrRows {
 public:
  // MemoryAllocationError if there is no room for a row.
  Status Open(const PackedImage& image);
  // Row y from the top: blue, green, red of each pixel; a view of the image itself when that has 24
  // bits, else a row of this reader, which the next call overwrites.
  const uint8_t* Row(int32_t y);
  // The same into `bgr`, three bytes per pixel.
  void CopyRow(int32_t y, uint8_t* bgr) const;

 private:
  using Expand = void (*)(const uint8_t* packed, const uint8_t* colorTable, int32_t width,
                          uint8_t* bgr);

  const PackedImage* image_ = nullptr;
  Expand expand_ = nullptr;  // chosen by depth; null for 24 bits
  std::array<uint8_t, 1024> colors_{};
  platform::MemoryBlock row_;
};

// Makes a copy of `image` at a greater depth: 4, 8 or 24 bits. A deeper palette image keeps its
// indices and the colors of the shallower one at the front of its table, the rest black.
// UnsuitableImage when `bits` is not above the image's depth, else as NewPackedImage.
Status PromoteImage(const PackedImage& image, int32_t bits, PackedImage& promoted);

// Replaces the picture's image by one of at least `bits` (as PromoteImage) and sets `bitsPerPixel`.
// A picture that is as deep already stays as it is. On failure the picture is unchanged.
Status PromotePicture(PictureRecord& picture, int32_t bits = 24);

// Brings a picture to 24 bits with an alpha plane, opaque where it had none. Statuses as
// NewPackedImage; on failure the picture may have been promoted but is whole.
Status PromoteToAlpha(PictureRecord& picture);

// The distinct colors of an image, up to a number, with the index of each.
class ColorSet {
 public:
  static constexpr int32_t kMost = 256;

  ColorSet() { slots_.fill(kFree); }  // empty
  // Takes in the pixels of a row, blue, green, red. False, at once, when there are more than `most`
  // colors.
  bool AddRow(const uint8_t* bgr, int32_t width, int32_t most = kMost);
  int32_t Count() const { return count_; }  // different colors so far
  // Puts the colors into order of brightness, numbers them, and writes them to `palette`, black
  // behind the last.
  void Number(Palette& palette);
  // The number of a color, 0x00RRGGBB, that is in the set.
  uint8_t IndexOf(uint32_t color) const { return indices_[SlotOf(color)]; }

 private:
  static constexpr uint32_t kFree = 0xffffffff;
  static constexpr uint32_t kSlots = 1024;  // four a color, so that a search ends soon
  uint32_t SlotOf(uint32_t color) const {
    uint32_t slot = (color * 0x9e3779b1u) >> 22;
    while (slots_[slot] != color && slots_[slot] != kFree) slot = (slot + 1) % kSlots;
    return slot;
  }

  std::array<uint32_t, kSlots> slots_;
  std::array<uint8_t, kSlots> indices_{};
  int32_t count_ = 0;
};

// Replaces the picture's image by the shallowest palette image (1, 4 or 8 bits, at most `maxBits`)
// that holds the colors that it uses, exactly, and sets palette and `bitsPerPixel`; the palette is
// in order of brightness. `packed` tells whether that was done: not when there are too many colors,
// nor when the image is as shallow already. The alpha plane stays. MemoryAllocationError leaves the
// picture unchanged.
Status PackFewColors(PictureRecord& picture, int32_t maxBits, bool& packed);

// Packs a row of indices, one a byte, into pixels of 1, 4 or 8 bits from the most significant bit
// down. Bits of the last byte behind the row's end become 0.
void PackIndices(const uint8_t* indices, int32_t width, int32_t bits, uint8_t* packed);

}  // namespace fotomill
