#include "metadata/gps.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <numbers>

#include "core/text.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Parses and removes a number, with leading spaces and a plus sign.
template <typename Number>
bool TakeNumber(std::string_view& text, Number& number) {
  text.remove_prefix(std::min(text.find_first_not_of(" \t"), text.size()));
  if (text.starts_with('+')) text.remove_prefix(1);
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc{}) return false;
  text.remove_prefix(static_cast<size_t>(end - text.data()));
  return true;
}

bool TakeComma(std::string_view& text) {
  if (!text.starts_with(',')) return false;
  text.remove_prefix(1);
  return true;
}

bool TakeAngle(std::string_view& text, GpsAngle& angle) {
  if (!TakeNumber(text, angle.degrees) || !TakeComma(text) || !TakeNumber(text, angle.minutes) ||
      !TakeComma(text) || !TakeNumber(text, angle.seconds) || !TakeComma(text) || text.empty()) {
    return false;
  }
  angle.hemisphere = text.front();
  text.remove_prefix(1);
  return std::isfinite(angle.seconds);
}

}  // namespace

bool ParseGpsLocation(std::string_view text, GpsLocation& location) {
  location = {};
  GpsLocation parsed;
  if (!TakeAngle(text, parsed.latitude) || !TakeComma(text) || !TakeAngle(text, parsed.longitude))
    return false;
  location = parsed;
  return true;
}

bool ParseGpsDegrees(std::string_view text, double& latitude, double& longitude) {
  double first = 0, second = 0;
  const bool parsed = TakeNumber(text, first) && TakeComma(text) && TakeNumber(text, second);
  if (!parsed || !text.empty() || !(std::abs(first) <= 90) || !(std::abs(second) <= 360))
    return false;
  latitude = first;
  longitude = second;
  return true;
}

double GpsDegrees(const GpsAngle& angle) {
  const char letter = UpperCase(angle.hemisphere);
  const double sign = letter == 'W' || letter == 'S' ? -1 : 1;
  return sign * (angle.degrees + angle.minutes / 60.0 + angle.seconds / 3600.0);
}

std::string GpsDegreesText(double degrees) {
  char text[32];
  const auto [end, error] =
      std::to_chars(text, text + sizeof text, degrees, std::chars_format::fixed, 5);
  return error == std::errc{} ? std::string(text, end) : std::string();
}

std::string GpsPlaceText(double latitude, double longitude) {
  const auto angle = [](double degrees, const char* hemispheres) {
    const int64_t hundredths = std::llround(std::abs(degrees) * 360000);  // of seconds
    char text[48];
    std::snprintf(text, sizeof text, "%d° %02d' %02d.%02d\" %c", int(hundredths / 360000),
                  int(hundredths / 6000 % 60), int(hundredths / 100 % 60), int(hundredths % 100),
                  hemispheres[degrees < 0 ? 1 : 0]);
    return std::string(text);
  };
  return angle(latitude, "NS") + ", " + angle(longitude, "EW") + " (" + GpsDegreesText(latitude) +
         ", " + GpsDegreesText(longitude) + ")";
}

double GpsDistance(double latitude1, double longitude1, double latitude2, double longitude2,
                   choice::DistanceUnit unit) {
  constexpr double kRadians = std::numbers::pi / 180;
  const double radius = unit == choice::kMiles ? 3956 : 6367;
  const double alongLatitude = std::sin((latitude2 - latitude1) * kRadians / 2);
  const double alongLongitude = std::sin((longitude2 - longitude1) * kRadians / 2);
  const double a = alongLatitude * alongLatitude + std::cos(latitude1 * kRadians) *
                                                       std::cos(latitude2 * kRadians) *
                                                       alongLongitude * alongLongitude;
  // rounding may exceed the range for opposite points
  const double part = std::clamp(a, 0.0, 1.0);
  return radius * 2 * std::atan2(std::sqrt(part), std::sqrt(1 - part));
}

std::string_view DistanceUnitName(choice::DistanceUnit unit) {
  return unit == choice::kMiles ? TrLater("miles") : TrLater("kilometers");
}

}  // namespace fotomill
