#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>

struct jpeg_compress_struct;
struct jpeg_decompress_struct;

namespace fotomill {

// Quantization tables and chroma subsampling of a JPEG file, which determine its quality.
struct JpegCoding {
  // One color component, or the gray one.
  struct Component {
    int32_t across = 1, down = 1;         // sampling factors
    std::array<uint16_t, 64> table = {};  // quantization table, row by row
    bool operator==(const Component&) const = default;
  };
  size_t count = 0;  // components: 1 for gray pictures, 3 for YCbCr
  std::array<Component, 3> components = {};
};

// For a decoded file. Null for other color spaces.
std::shared_ptr<const JpegCoding> CodingOf(const jpeg_decompress_struct& info);

// Applies the same quantization and subsampling to an encoder whose parameters are set. If the
// source was gray, its table is used for all colors.
void SetCoding(jpeg_compress_struct& info, const JpegCoding& coding);

}  // namespace fotomill
