#pragma once

#include <cstddef>
#include <cstdint>

#include "registry/registry.h"

namespace fotomill::fuzz {

// Runs `info`, `read` and `details` of a row on a file of these bytes, then writes what it got, in
// the row's own format and as a bitmap. Settings that codecs look at are drawn from a hash of the
// bytes. Stops the program when a failing reader leaves a picture behind, or when `info` and `read`
// disagree about its size.
void TryCodec(const char* extension, const uint8_t* data, size_t size);

}  // namespace fotomill::fuzz
