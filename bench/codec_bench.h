#pragma once

#include <cstdint>

#include "registry/registry.h"

namespace fotomill::bench {

// Pixels of the pictures to decode and encode.
struct Size {
  int32_t width = 2000;
  int32_t height = 1500;
};

// Registers decoding and encoding of one format at each of the depths: `FORMAT/decode/photo/24` and
// the like, in bytes of packed rows a second. Pictures are once like a photograph and once with
// even areas; files lie in the system's temporary folder.
void RegisterCodec(const char* extension, std::initializer_list<int32_t> depths, Size size = {});

}  // namespace fotomill::bench
