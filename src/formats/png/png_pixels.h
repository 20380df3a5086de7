#pragma once

#include <cstdint>
#include <span>

#include "platform/memory.h"

namespace fotomill {

// The rows of a PNG that is not interlaced, inflated all at once and freed of their filters one by
// one.
class PngPixels {
 public:
  // Inflates the pixels of a file whose rows have `rowBytes` and whose pixels have `pixelBits`.
  // False when that is not possible for whatever reason, damage included, or takes more than `room`
  // bytes: another decoder must try.
  [[nodiscard]] bool Inflate(std::span<const uint8_t> file, uint64_t rowBytes, uint32_t pixelBits,
                             int32_t height, uint64_t room);
  // The next row, from the top; null when its filter does not exist.
  const uint8_t* NextRow();

 private:
  platform::MemoryBlock filtered_, firstAbove_;
  uint64_t rowBytes_ = 0;
  uint32_t pixelBytes_ = 1;
  int32_t next_ = 0;
};

}  // namespace fotomill
