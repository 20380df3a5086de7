#pragma once

#include <cstdint>

#include "registry/registry.h"

namespace fotomill::bench {

// Size of the pictures to decode and encode.
struct Size {
  int32_t width = 2000;
  int32_t height = 1500;
};

// Registers benchmarks for decoding and encoding a format at each depth: `FORMAT/decode/photo/24`
// and so on, in bytes of packed rows per second. Pictures are photo-like or have flat areas; files
// are in the system's temporary folder.
void RegisterCodec(const char* extension, std::initializer_list<int32_t> depths, Size size = {});

}  // namespace fotomill::bench
