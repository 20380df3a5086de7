#pragma once

#include <string>
#include <string_view>

#include "core/choice_lists.h"

namespace fotomill {

// Degrees, minutes and seconds with the hemisphere letter.
struct GpsAngle {
  int degrees = 0, minutes = 0;
  double seconds = 0;
  char hemisphere = '\0';
};
// A position; if unknown, both angles are zero without hemisphere.
struct GpsLocation {
  GpsAngle latitude, longitude;
};

// Parses a location such as "45,19,48.000,N,79,13,12.000,W". Blanks before numbers and text after
// the last letter are allowed. False, with `location` zero, for any other text. Independent of the
// locale.
[[nodiscard]] bool ParseGpsLocation(std::string_view text, GpsLocation& location);

// Parses "LAT,LON" in decimal degrees, up to 90 and 360. False, with both unchanged, for any other
// text.
[[nodiscard]] bool ParseGpsDegrees(std::string_view text, double& latitude, double& longitude);

// Decimal degrees, negative for "W" and "S" in either case.
double GpsDegrees(const GpsAngle& angle);

// Decimal degrees with five decimals and a point in every locale, as ParseGpsDegrees reads them.
std::string GpsDegreesText(double degrees);

// A position as text that maps also accept:
// "45° 19' 48.00\" N, 79° 13' 12.00\" W (45.33000, -79.22000)".
std::string GpsPlaceText(double latitude, double longitude);

// Great-circle distance between two positions in decimal degrees, in miles (radius 3956) or
// kilometers (6367). Source: R. W. Sinnott, "Virtues of the Haversine", Sky and Telescope 68/2
// (1984).
double GpsDistance(double latitude1, double longitude1, double latitude2, double longitude2,
                   choice::DistanceUnit unit);
// English unit name, "miles" or "kilometers".
std::string_view DistanceUnitName(choice::DistanceUnit unit);

}  // namespace fotomill
