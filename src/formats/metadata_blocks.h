#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "picture/picture_record.h"

namespace fotomill {

// Copies a metadata block of a file. `block` is empty after that where the file has none or where
// it is larger than the limit for metadata.
void TakeBlock(std::span<const uint8_t> data, std::vector<uint8_t>& block);

// Sets the resolution in pixels per inch, where both values are finite and above 0.
void TakeResolution(double dpiX, double dpiY, PictureMetadata& metadata);

}  // namespace fotomill
