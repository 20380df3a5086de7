#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "containers/png_chunks.h"

namespace fotomill {

// Metadata that older programs store in PNG text chunks with the keyword "Raw profile type NAME": a
// line with a name, one with the number of bytes, and the bytes as hexadecimal digits.
enum class PngRawProfile : uint8_t { None, Exif, Xmp, Iptc, Other };

// The kind of profile in a text chunk with this keyword.
PngRawProfile PngRawProfileOf(std::string_view keyword);

// The bytes of the profile in a chunk; empty if it is damaged.
std::vector<uint8_t> ReadPngRawProfile(const PngChunk& chunk);

// The data of a zTXt chunk with a profile.
std::vector<uint8_t> MakePngRawProfile(std::string_view keyword, std::span<const uint8_t> bytes);

}  // namespace fotomill
