#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace fotomill {

// Dates and times as EXIF has them, without a time zone: seconds since 1970-01-01 on the camera's
// clock.

// "2024:05:31 14:03:00", also with hyphens between the numbers of the date and a T in front of the
// time. None for what is no such text or no day of the calendar.
std::optional<int64_t> ParseExifTime(std::string_view text);
// The text with colons; years 0 to 9999.
std::string ExifTimeText(int64_t seconds);

// A distance of times: "+1:30:00", "-0:05", hours of any number. In seconds; none for other texts.
std::optional<int64_t> ParseTimeShift(std::string_view text);

}  // namespace fotomill
