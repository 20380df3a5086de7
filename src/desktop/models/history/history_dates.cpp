#include "desktop/models/history/history_dates.h"

#include <cstdio>

#include "core/choice_lists.h"
#include "platform/clock.h"
#include "texts/texts.h"

namespace fotomill::desktop {

std::string HistoryDate(int64_t seconds, int32_t mode) {
  static constexpr const char* kDays[] = {
      TrLater("Sunday"),   TrLater("Monday"), TrLater("Tuesday"), TrLater("Wednesday"),
      TrLater("Thursday"), TrLater("Friday"), TrLater("Saturday")};
  static constexpr const char* kMonths[] = {
      TrLater("January"),   TrLater("February"), TrLater("March"),    TrLater("April"),
      TrLater("May"),       TrLater("June"),     TrLater("July"),     TrLater("August"),
      TrLater("September"), TrLater("October"),  TrLater("November"), TrLater("December")};
  const platform::LocalTime time = platform::LocalTimeOf(seconds);
  if (time.month < 1 || time.month > 12 || time.weekday < 0 || time.weekday > 6) return {};
  const bool full = mode == choice::kFullCivilian || mode == choice::kFullMilitary;
  const bool civilian = mode == choice::kFullCivilian || mode == choice::kCompactCivilian;
  char date[32], clock[32];
  std::snprintf(date, sizeof date, "%04d-%02d-%02d", time.year, time.month, time.day);
  const int32_t hour = !civilian ? time.hour : time.hour % 12 == 0 ? 12 : time.hour % 12;
  const int length =
      std::snprintf(clock, sizeof clock, civilian ? "%d:%02d" : "%02d:%02d", hour, time.minute);
  // Translators: weekday, month, day, year.
  std::string text = full ? Tr("%1, %2 %3, %4", Tr(kDays[time.weekday]),
                               Tr(kMonths[time.month - 1]), time.day, time.year)
                          : std::string(date);
  text.append(" ").append(clock, static_cast<size_t>(length));
  if (full) {
    std::snprintf(clock, sizeof clock, ":%02d", time.second);
    text += clock;
  }
  if (civilian) text.append(" ").append(time.hour < 12 ? Tr("a.m.") : Tr("p.m."));
  return text;
}

}  // namespace fotomill::desktop
