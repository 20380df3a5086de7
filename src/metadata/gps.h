#pragma once

#include <string_view>

namespace fotomill {

// Degrees, minutes and seconds with their hemisphere letter.
struct GpsAngle {
  int degrees = 0, minutes = 0;
  double seconds = 0;
  char hemisphere = '\0';
};
struct GpsLocation {
  GpsAngle latitude, longitude;
};

// Reads a location of the form "45,19,48.000,N,79,13,12.000,W". False, with `location` at zero, for any other text;
// blanks in front of numbers and text behind the last letter are let pass. Not subject to the user's decimal sign.
[[nodiscard]] bool ParseGpsLocation(std::string_view text, GpsLocation& location);
// The location of the setting `ExifDefaultLocation`.
[[nodiscard]] bool DefaultGpsLocation(GpsLocation& location);

// Decimal degrees, negative for the hemispheres "W" and "S" in either case.
double GpsDegrees(const GpsAngle& angle);

// The distance of two places given in decimal degrees, over the surface of a sphere, in the unit that `ExifDistinceUnits`
// chooses: miles (radius 3956) when it is 0, else kilometres (6367).
// Source: R. W. Sinnott, "Virtues of the Haversine", Sky and Telescope 68/2 (1984).
double GpsDistance(double latitude1, double longitude1, double latitude2, double longitude2);
// The name of that unit, "miles" or "kilometers".
std::string_view GpsDistanceUnit();

}  // namespace fotomill
