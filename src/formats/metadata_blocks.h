#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "picture/picture_record.h"

namespace fotomill {

// Copies a metadata block of a file. `block` becomes empty if there is none or it exceeds the limit
// for metadata.
void TakeBlock(std::span<const uint8_t> data, std::vector<uint8_t>& block);

// Sets the resolution in pixels per inch, if both values are finite and above 0.
void TakeResolution(double dpiX, double dpiY, PictureMetadata& metadata);

}  // namespace fotomill
