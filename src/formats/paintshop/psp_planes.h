#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "formats/paintshop/psp_file.h"
#include "platform/memory.h"

namespace fotomill {

// The rows of a channel, whole in memory.
class PspPlane {
 public:
  // FileReadError when the data cannot hold the rows, DamagedFile, MemoryAllocationError,
  // UnsupportedFormat for JPEG.
  Status Open(const PspLayer& layer, const PspChannel& channel);

  // A row as samples of 8 bits; indices of fewer bits and samples of 16 are made that.
  void Row(int32_t y, std::span<uint8_t> samples) const;

 private:
  Status Unpack(const PspLayer& layer, std::span<const uint8_t> data, uint64_t size);

  platform::MemoryBlock unpacked_;
  std::span<const uint8_t> rows_;
  size_t rowSize_ = 0;
  int32_t bits_ = 8;  // of a sample
};

}  // namespace fotomill
