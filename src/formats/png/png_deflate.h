#pragma once

#include <cstdint>
#include <functional>

#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// Rows of a picture to be deflated, in PNG layout before filtering.
struct PngRows {
  uint64_t rowBytes = 0;
  uint32_t pixelBits = 8;
  int32_t height = 0;
  // Writes row `y` from the top. Must be thread-safe.
  std::function<void(int32_t y, uint8_t* row)> fetch;
};

// Writes the pixels as IDAT chunks: bands of rows, filtered if `filtered` is set and pixels are
// whole bytes, are deflated on all cores and joined to one stream. The output does not depend on
// the number of cores. `level` is 0 (uncompressed) to 9. `report` receives the number of finished
// rows and may stop with a status other than Ok. Else MemoryAllocationError, or ErrorWritingFile.
Status WritePngPixels(const PngRows& rows, bool filtered, int32_t level, ByteWriter& out,
                      const std::function<Status(int32_t)>& report);

}  // namespace fotomill
