#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "core/status.h"
#include "formats/photoshop/psd_file.h"
#include "platform/memory.h"

namespace fotomill {

// The rows of one channel from the top down, as samples of 8 bits or, of a bitmap, as 8 pixels a
// byte.
class PsdPlane {
 public:
  // The next row, `row` being as long as it is. DamagedFile when its code ends early, FileReadError
  // when data are missing.
  Status Next(std::span<uint8_t> row);

 private:
  friend class PsdPlanes;
  bool packed_ = false;
  std::span<const uint8_t> sizes_;  // of the packed rows that are to come, 2 bytes each
  std::span<const uint8_t> data_;
  bool wide_ = false;              // samples of 16 bits
  std::vector<uint8_t> unpacked_;  // a row of them
};

// The channels of one compression: all of the merged picture, or one of a layer.
class PsdPlanes {
 public:
  // `data` begins with the compression. Every channel has `height` rows of `width` samples.
  // FileReadError when the data cannot hold them, DamagedFile, MemoryAllocationError,
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

// Samples of 16 bits, high byte first, rounded to 8.
void NarrowPsdSamples(std::span<const uint8_t> wide, std::span<uint8_t> narrow);

}  // namespace fotomill
