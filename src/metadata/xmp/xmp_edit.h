#pragma once

#include <cstdint>
#include <span>

namespace fotomill {

// Overwrites every tiff:Orientation (1 to 8) in an
// XMP packet, attributes and elements. Adds none.
void SetXmpOrientation(std::span<uint8_t> packet, int32_t orientation);

// Overwrites the position properties (EXIF schema, names beginning with GPS) and place names (city,
// country and the like) with spaces; the packet keeps its length. False if there are none.
bool BlankXmpPlaces(std::span<uint8_t> packet);
// Whether that works: the packet is not in UTF-16 or UTF-32.
bool IsBlankableXmp(std::span<const uint8_t> packet);

}  // namespace fotomill
