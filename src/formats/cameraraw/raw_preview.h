#pragma once

#include <cstdint>
#include <span>

namespace fotomill {

// A small picture that a camera put into its raw file: a JPEG file, or rows from the top of red,
// green, blue.
struct RawPreview {
  int32_t width = 0, height = 0;  // of rows; a JPEG tells its own
  std::span<const uint8_t> jpeg;
  std::span<const uint8_t> rows;
};

// Whether a file is built of TIFF's directories.
bool IsRawFile(std::span<const uint8_t> file);
// The largest preview in a file's directories; false when there is none that can be read.
bool FindRawPreview(std::span<const uint8_t> file, RawPreview& preview);

}  // namespace fotomill
