#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "formats/paintshop/psp_file.h"
#include "platform/memory.h"

namespace fotomill {

// The decoded rows of a channel.
class PspPlane {
 public:
  // FileReadError if the data are too short for the rows, DamagedFile, MemoryAllocationError,
  // UnsupportedFormat for JPEG.
  Status Open(const PspLayer& layer, const PspChannel& channel);

  // A row as 8-bit samples, converted from narrower indices and 16-bit samples.
  void Row(int32_t y, std::span<uint8_t> samples) const;

 private:
  Status Unpack(const PspLayer& layer, std::span<const uint8_t> data, uint64_t size);

  platform::MemoryBlock unpacked_;
  std::span<const uint8_t> rows_;
  size_t rowSize_ = 0;
  int32_t bits_ = 8;  // per sample
};

}  // namespace fotomill
