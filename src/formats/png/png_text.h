#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "containers/png_chunks.h"

namespace fotomill {

// The keyword of a tEXt, zTXt or iTXt chunk.
std::string_view PngTextKeyword(const PngChunk& chunk);
// Its text as stored, inflated if necessary; empty
// if it is damaged or longer than `most` bytes.
std::vector<uint8_t> PngTextOf(const PngChunk& chunk, uint64_t most);

}  // namespace fotomill
