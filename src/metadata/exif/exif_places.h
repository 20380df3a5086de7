#pragma once

#include <cstdint>
#include <optional>
#include <span>

namespace fotomill {

// A place in decimal degrees, negative in the south and the west.
struct ExifPlace {
  double latitude = 0, longitude = 0;
};

// The places that the GPS directory of an EXIF block tells; none where an angle or its hemisphere
// is missing or impossible. Source: CIPA DC-008-2012, section 4.6.6.
struct ExifPlaces {
  std::optional<ExifPlace> taken;        // where the picture was taken
  std::optional<ExifPlace> destination;  // what it shows
};
ExifPlaces FindExifPlaces(std::span<const uint8_t> block);

}  // namespace fotomill
