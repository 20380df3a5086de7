#pragma once

#include <string_view>

#include "core/choice_lists.h"

namespace fotomill {

// Degrees, minutes and seconds with their hemisphere letter.
struct GpsAngle {
  int degrees = 0, minutes = 0;
  double seconds = 0;
  char hemisphere = '\0';
};
// A place on the earth; both angles are zero and without hemisphere when nothing is known.
struct GpsLocation {
  GpsAngle latitude, longitude;
};

// Reads a location of the form "45,19,48.000,N,79,13,12.000,W". False, with `location` at zero, for
// any other text; blanks in front of numbers and text behind the last letter are let pass. Not
// subject to the user's decimal sign.
[[nodiscard]] bool ParseGpsLocation(std::string_view text, GpsLocation& location);

// Reads "LAT,LON" in decimal degrees: at most 90 and 360. False, with both unchanged, for any other
// text.
[[nodiscard]] bool ParseGpsDegrees(std::string_view text, double& latitude, double& longitude);

// Decimal degrees, negative for the hemispheres "W" and "S" in either case.
double GpsDegrees(const GpsAngle& angle);

// The distance of two places given in decimal degrees, over the surface of a sphere, in miles
// (radius 3956) or kilometers (6367). Source: R. W. Sinnott, "Virtues of the Haversine", Sky and
// Telescope 68/2 (1984).
double GpsDistance(double latitude1, double longitude1, double latitude2, double longitude2,
                   choice::DistanceUnit unit);
// The name of a unit in English, "miles" or "kilometers".
std::string_view DistanceUnitName(choice::DistanceUnit unit);

}  // namespace fotomill
