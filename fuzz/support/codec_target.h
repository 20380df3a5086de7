#pragma once

#include <cstddef>
#include <cstdint>

#include "registry/registry.h"

namespace fotomill::fuzz {

// Runs `info`, `read` and `details` of a row on a file with these bytes, then writes the result
// in the row's own format and as a bitmap. The codecs' settings are derived from a hash of the
// bytes. Aborts if a failing reader leaves a picture behind, or if `info` and `read` disagree
// about its size.
void TryCodec(const char* extension, const uint8_t* data, size_t size);

}  // namespace fotomill::fuzz
