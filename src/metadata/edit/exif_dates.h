#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace fotomill {

// EXIF dates and times have no time zone: seconds
// since 1970-01-01 by the camera's clock.

// "2024:05:31 14:03:00"; the date may also have hyphens, and a T before the time. None if malformed
// or not a calendar day.
std::optional<int64_t> ParseExifTime(std::string_view text);
// Formats a time with colons; years 0 to 9999.
std::string ExifTimeText(int64_t seconds);

// Parses a time difference: "+1:30:00", "-0:05", any number of hours. In seconds; none if invalid.
std::optional<int64_t> ParseTimeShift(std::string_view text);

}  // namespace fotomill
