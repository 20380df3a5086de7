#pragma once

#include <cstdint>
#include <span>

namespace fotomill {

// Overwrites every tiff:Orientation (1 to 8) in an
// XMP packet, attributes and elements. Adds none.
void SetXmpOrientation(std::span<uint8_t> packet, int32_t orientation);

// Overwrites the position properties (EXIF schema, names beginning with GPS) with spaces; the
// packet keeps its length. False if there are none.
bool BlankXmpPlaces(std::span<uint8_t> packet);

}  // namespace fotomill
