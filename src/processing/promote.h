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
  // MemoryAllocationError if memory runs out.
  Status Open(const PackedImage& image);
  // Row y from the top: blue, green, red of each pixel; a view of the image itself if it has 24
  // bits, else a buffer that the next call overwrites.
  const uint8_t* Row(int32_t y);
  // As Row, but copies to `bgr`, three bytes per pixel.
  void CopyRow(int32_t y, uint8_t* bgr) const;

 private:
  using Expand = void (*)(const uint8_t* packed, const uint8_t* colorTable, int32_t width,
                          uint8_t* bgr);

  const PackedImage* image_ = nullptr;
  Expand expand_ = nullptr;  // by depth; null for 24 bits
  std::array<uint8_t, 1024> colors_{};
  platform::MemoryBlock row_;
};

// Copies `image` at a greater depth: 4, 8 or 24 bits. Palette images keep their indices and colors;
// additional palette entries are black. UnsuitableImage if `bits` is not above the image's depth,
// else as NewPackedImage.
Status PromoteImage(const PackedImage& image, int32_t bits, PackedImage& promoted);

// Converts the picture's image to at least `bits` (as PromoteImage) and sets `bitsPerPixel`.
// Pictures of that depth are unchanged. On failure the picture is unchanged.
Status PromotePicture(PictureRecord& picture, int32_t bits = 24);

// Converts a picture to 24 bits with an alpha plane, opaque if it had none. Statuses as
// NewPackedImage; on failure the picture may have been promoted but is valid.
Status PromoteToAlpha(PictureRecord& picture);

// The distinct colors of an image, up to a limit, with an index for each.
class ColorSet {
 public:
  static constexpr int32_t kMost = 256;

  ColorSet() { slots_.fill(kFree); }  // empty
  // Adds the pixels of a row, blue, green, red. Returns false as soon as there are more
  // than `most` colors.
  bool AddRow(const uint8_t* bgr, int32_t width, int32_t most = kMost);
  int32_t Count() const { return count_; }  // distinct colors so far
  // Sorts and numbers the colors by brightness, and
  // writes them to `palette`, padded with black.
  void Number(Palette& palette);
  // The index of a color, 0x00RRGGBB, which must be in the set.
  uint8_t IndexOf(uint32_t color) const { return indices_[SlotOf(color)]; }

 private:
  static constexpr uint32_t kFree = 0xffffffff;
  static constexpr uint32_t kSlots = 1024;  // four per color, to keep probing short
  uint32_t SlotOf(uint32_t color) const {
    uint32_t slot = (color * 0x9e3779b1u) >> 22;
    while (slots_[slot] != color && slots_[slot] != kFree) slot = (slot + 1) % kSlots;
    return slot;
  }

  std::array<uint32_t, kSlots> slots_;
  std::array<uint8_t, kSlots> indices_{};
  int32_t count_ = 0;
};

// Converts the picture to the shallowest palette image (1, 4 or 8 bits, at
// most `maxBits`) with exactly the colors it uses, sorted by brightness, and
// sets palette and `bitsPerPixel`. `packed` tells whether that was done: not
// if there are too many colors, or if the image is that shallow already. The
// alpha plane is kept. MemoryAllocationError leaves the picture unchanged.
Status PackFewColors(PictureRecord& picture, int32_t maxBits, bool& packed);

// Packs a row of indices, one per byte, into pixels of 1, 4 or 8 bits, most significant bit first.
// Padding bits in the last byte are 0.
void PackIndices(const uint8_t* indices, int32_t width, int32_t bits, uint8_t* packed);

}  // namespace fotomill
