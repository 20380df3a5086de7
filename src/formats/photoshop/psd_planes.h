#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "formats/photoshop/psd_file.h"
#include "platform/memory.h"

namespace fotomill {

// The rows of one channel, top first, as 8-bit
// samples or, for a bitmap, with 8 pixels per byte.
class PsdPlane {
 public:
  // The next row, of the size of `row`. DamagedFile if the packed row is incomplete, FileReadError
  // if the data are truncated.
  Status Next(std::span<uint8_t> row);

 private:
  friend class PsdPlanes;
  bool packed_ = false;
  std::span<const uint8_t> sizes_;  // of the remaining packed rows, 2 bytes each
  std::span<const uint8_t> data_;
  bool wide_ = false;              // 16-bit samples
  std::vector<uint8_t> unpacked_;  // one row
};

// Channels with a common compression: all of the merged picture, or one of a layer.
class PsdPlanes {
 public:
  // `data` starts with the compression. Every channel has `height` rows of `width` samples.
  // FileReadError if the data are too short for them, DamagedFile, MemoryAllocationError,
  // UnsupportedFormat for an unknown compression.
  Status Open(std::span<const uint8_t> data, const PsdHeader& header, int32_t width, int32_t height,
              size_t channels);

  PsdPlane& operator[](size_t channel) { return planes_[channel]; }

 private:
  Status OpenPacked(std::span<const uint8_t> data, size_t height);
  Status Inflate(std::span<const uint8_t> data, const PsdHeader& header, size_t rowSize,
                 size_t rows, bool differences);

  std::vector<PsdPlane> planes_;
  platform::MemoryBlock inflated_;
};

// Rounds big-endian 16-bit samples to 8 bits.
void NarrowPsdSamples(std::span<const uint8_t> wide, std::span<uint8_t> narrow);

}  // namespace fotomill
