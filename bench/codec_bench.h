#pragma once

#include <cstdint>

#include "picture/registry.h"

namespace fotomill::bench {

// Registers decoding and encoding of one format at each of the depths: `FORMAT/decode/photo/24` and the like, in bytes
// of packed rows a second. Pictures are 2000 x 1500, once like a photograph and once with even areas; files lie in the
// system's temporary folder.
void RegisterCodec(const char* extension, std::initializer_list<int32_t> depths);

}  // namespace fotomill::bench
