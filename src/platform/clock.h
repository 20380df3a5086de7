#pragma once

#include <cstdint>

namespace fotomill::platform {

// Seconds since 1970-01-01 UTC. Tests may fix it; a negative value returns to the system's clock.
int64_t Now();
void FixNow(int64_t seconds);  // seconds since 1970; for tests: Now gives this from here on
// Seconds of a clock that never jumps, for rates and time left.
double MonotonicSeconds();

// A moment on the user's wall clock; month and day count from 1.
struct LocalTime {
  int32_t year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0;
  int32_t weekday = 0;  // 0 is Sunday
};
// All zero for a moment that the calendar cannot express.
LocalTime LocalTimeOf(int64_t seconds);

}  // namespace fotomill::platform
