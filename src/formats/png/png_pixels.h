#pragma once

#include <cstdint>
#include <span>

#include "platform/memory.h"

namespace fotomill {

// The rows of a non-interlaced PNG, inflated
// at once and unfiltered one by one.
class PngPixels {
 public:
  // Inflates the pixels of a file with `rowBytes` per row and `pixelBits` per pixel. False if that
  // fails for any reason, including damaged data, or takes more than `room` bytes: another decoder
  // must try.
  [[nodiscard]] bool Inflate(std::span<const uint8_t> file, uint64_t rowBytes, uint32_t pixelBits,
                             int32_t height, uint64_t room);
  // The next row, top first; null if its filter is invalid.
  const uint8_t* NextRow();

 private:
  platform::MemoryBlock filtered_, firstAbove_;
  uint64_t rowBytes_ = 0;
  uint32_t pixelBytes_ = 1;
  int32_t next_ = 0;
};

}  // namespace fotomill
