#pragma once

#include <cstdint>

namespace fotomill::platform {

// Seconds since 1970-01-01 UTC. Tests may override it.
int64_t Now();
void FixNow(int64_t seconds);  // for tests: Now() returns this; negative: system clock again
// Seconds of a monotonic clock, for rates and time remaining.
double MonotonicSeconds();

// A point in local time; month and day start at 1.
struct LocalTime {
  int32_t year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0;
  int32_t weekday = 0;  // 0 is Sunday
};
// All zero for a time that the calendar cannot express.
LocalTime LocalTimeOf(int64_t seconds);

}  // namespace fotomill::platform
