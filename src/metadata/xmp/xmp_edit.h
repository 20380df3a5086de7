#pragma once

#include <cstdint>
#include <span>

namespace fotomill {

// Sets every orientation of a picture (tiff:Orientation, 1 to 8) that an XMP packet tells, as an
// attribute or as an element, in place. Adds none.
void SetXmpOrientation(std::span<uint8_t> packet, int32_t orientation);

// Overwrites the properties that tell a place, those of the EXIF schema whose names begin with GPS,
// with blanks; the packet keeps its length. False if it has none.
bool BlankXmpPlaces(std::span<uint8_t> packet);

}  // namespace fotomill
