#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>

struct jpeg_compress_struct;
struct jpeg_decompress_struct;

namespace fotomill {

// How a JPEG file quantized its picture and sampled its colors: what decides about its quality.
struct JpegCoding {
  // One color channel, or the gray one.
  struct Component {
    int32_t across = 1, down = 1;         // sampling factors
    std::array<uint16_t, 64> table = {};  // quantization, row by row
    bool operator==(const Component&) const = default;
  };
  size_t count = 0;  // of the components: 1 of gray pictures, 3 of YCbCr
  std::array<Component, 3> components = {};
};

// Of a file whose picture has been decoded. Null for those that are stored in other colors.
std::shared_ptr<const JpegCoding> CodingOf(const jpeg_decompress_struct& info);

// Has an encoder whose parameters are set quantize and sample in the same way. Colors from a gray
// picture are quantized like it.
void SetCoding(jpeg_compress_struct& info, const JpegCoding& coding);

}  // namespace fotomill
