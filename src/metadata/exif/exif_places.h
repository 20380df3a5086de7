#pragma once

#include <cstdint>
#include <optional>
#include <span>

namespace fotomill {

// A position in decimal degrees, negative for south and west.
struct ExifPosition {
  double latitude = 0, longitude = 0;
};

// The positions in the GPS directory of an EXIF block; none if an angle or its hemisphere is
// missing or invalid. Source: CIPA DC-008-2012, section 4.6.6.
struct ExifPlaces {
  std::optional<ExifPosition> taken;        // where the picture was taken
  std::optional<ExifPosition> destination;  // the position shown
};
ExifPlaces FindExifPlaces(std::span<const uint8_t> block);

}  // namespace fotomill
