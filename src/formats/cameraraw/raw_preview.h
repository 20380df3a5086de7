#pragma once

#include <cstdint>
#include <span>

namespace fotomill {

// An embedded preview: a JPEG file, or rows
// of red, green, blue, top row first.
struct RawPreview {
  int32_t width = 0, height = 0;  // of `rows`; not used for JPEG
  std::span<const uint8_t> jpeg;
  std::span<const uint8_t> rows;
};

// Whether a file is based on TIFF directories.
bool IsRawFile(std::span<const uint8_t> file);
// The largest preview in a file's directories; false if there is no usable one.
bool FindRawPreview(std::span<const uint8_t> file, RawPreview& preview);

}  // namespace fotomill
