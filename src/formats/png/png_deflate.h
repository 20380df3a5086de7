#pragma once

#include <cstdint>
#include <functional>

#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// Rows of a picture to be deflated, as PNG stores them before filtering.
struct PngRows {
  uint64_t rowBytes = 0;
  uint32_t pixelBits = 8;
  int32_t height = 0;
  // Writes row `y` from the top. Called from several threads at once.
  std::function<void(int32_t y, uint8_t* row)> fetch;
};

// Writes the pixels as IDAT chunks: bands of rows, filtered where their pixels are whole bytes and
// `filtered` says so, are deflated on all cores and joined to one stream. The bytes do not depend
// on the number of cores. `level` is 0, not compressed, to 9. `report` hears of finished rows and
// ends it with a status that is not Ok. Else MemoryAllocationError, or ErrorWritingFile.
Status WritePngPixels(const PngRows& rows, bool filtered, int32_t level, ByteWriter& out,
                      const std::function<Status(int32_t)>& report);

}  // namespace fotomill
