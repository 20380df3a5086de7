#include "metadata/edit/exif_dates.h"

#include <charconv>
#include <chrono>
#include <cstdio>

#include "core/text.h"

namespace fotomill {

namespace {

// Parses exactly `count` digits.
bool TakeDigits(std::string_view& text, size_t count, int& number) {
  number = 0;
  if (text.size() < count) return false;
  for (size_t i = 0; i < count; ++i) {
    if (!IsDigit(text[i])) return false;
    number = number * 10 + (text[i] - '0');
  }
  text.remove_prefix(count);
  return true;
}

bool TakeOneOf(std::string_view& text, std::string_view characters) {
  if (text.empty() || characters.find(text[0]) == std::string_view::npos) return false;
  text.remove_prefix(1);
  return true;
}

}  // namespace

std::optional<int64_t> ParseExifTime(std::string_view text) {
  int year, month, day, hour, minute, second;
  const bool fits =
      TakeDigits(text, 4, year) && TakeOneOf(text, ":-") && TakeDigits(text, 2, month) &&
      TakeOneOf(text, ":-") && TakeDigits(text, 2, day) && TakeOneOf(text, " T") &&
      TakeDigits(text, 2, hour) && TakeOneOf(text, ":") && TakeDigits(text, 2, minute) &&
      TakeOneOf(text, ":") && TakeDigits(text, 2, second) && text.empty();
  if (!fits || hour > 23 || minute > 59 || second > 59) return {};
  const std::chrono::year_month_day date{std::chrono::year(year),
                                         std::chrono::month(static_cast<unsigned>(month)),
                                         std::chrono::day(static_cast<unsigned>(day))};
  if (!date.ok()) return {};
  const int64_t days = std::chrono::sys_days(date).time_since_epoch().count();
  return days * 86400 + hour * 3600 + minute * 60 + second;
}

std::string ExifTimeText(int64_t seconds) {
  const int64_t days = seconds >= 0 ? seconds / 86400 : -((-seconds + 86399) / 86400);
  const auto rest = static_cast<int>(seconds - days * 86400);
  const std::chrono::year_month_day date{
      std::chrono::sys_days(std::chrono::days(static_cast<int>(days)))};
  char text[48];
  std::snprintf(text, sizeof text, "%04d:%02u:%02u %02d:%02d:%02d", static_cast<int>(date.year()),
                static_cast<unsigned>(date.month()), static_cast<unsigned>(date.day()), rest / 3600,
                rest / 60 % 60, rest % 60);
  return text;
}

std::optional<int64_t> ParseTimeShift(std::string_view text) {
  constexpr int64_t kMostHours = 9999 * int64_t{8784};  // the largest difference between two dates
  if (text.empty() || (text[0] != '+' && text[0] != '-')) return {};
  const int64_t sign = text[0] == '-' ? -1 : 1;
  text.remove_prefix(1);
  int64_t hours = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), hours);
  if (error != std::errc{} || hours < 0 || hours > kMostHours) return {};
  text.remove_prefix(static_cast<size_t>(end - text.data()));
  int minutes = 0, seconds = 0;
  if (!TakeOneOf(text, ":") || !TakeDigits(text, 2, minutes) || minutes > 59) return {};
  if (!text.empty() && (!TakeOneOf(text, ":") || !TakeDigits(text, 2, seconds) || seconds > 59))
    return {};
  return text.empty() ? std::optional(sign * (hours * 3600 + minutes * 60 + seconds))
                      : std::nullopt;
}

}  // namespace fotomill
