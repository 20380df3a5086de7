#include "desktop/models/history/history_dates.h"

#include <cstdio>

#include "core/choice_lists.h"
#include "platform/clock.h"

namespace fotomill::desktop {

std::string HistoryDate(int64_t seconds, int32_t mode) {
  static constexpr const char* kDays[] = {"Sunday", "Monday", "Tuesday", "Wednesday", "Thursday", "Friday", "Saturday"};
  static constexpr const char* kMonths[] = {"January", "February", "March",     "April",   "May",      "June",
                                            "July",    "August",   "September", "October", "November", "December"};
  const platform::LocalTime time = platform::LocalTimeOf(seconds);
  if (time.month < 1 || time.month > 12 || time.weekday < 0 || time.weekday > 6) return {};
  const bool full = mode == choice::kFullCivilian || mode == choice::kFullMilitary;
  const bool civilian = mode == choice::kFullCivilian || mode == choice::kCompactCivilian;
  char date[64], clock[32];
  if (full) {
    std::snprintf(date, sizeof date, "%s, %s %d, %d", kDays[time.weekday], kMonths[time.month - 1], time.day, time.year);
  } else {
    std::snprintf(date, sizeof date, "%04d-%02d-%02d", time.year, time.month, time.day);
  }
  const int32_t hour = !civilian ? time.hour : time.hour % 12 == 0 ? 12 : time.hour % 12;
  const int length = std::snprintf(clock, sizeof clock, civilian ? "%d:%02d" : "%02d:%02d", hour, time.minute);
  std::string text = std::string(date) + " " + std::string(clock, static_cast<size_t>(length));
  if (full) {
    std::snprintf(clock, sizeof clock, ":%02d", time.second);
    text += clock;
  }
  if (civilian) text += time.hour < 12 ? " a.m." : " p.m.";
  return text;
}

}  // namespace fotomill::desktop
