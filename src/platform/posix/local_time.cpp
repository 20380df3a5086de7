#include <ctime>

#include "platform/clock.h"

namespace fotomill::platform {

LocalTime LocalTimeOf(int64_t seconds) {
  const time_t moment = static_cast<time_t>(seconds);
  struct tm parts;
  if (localtime_r(&moment, &parts) == nullptr) return {};
  return {parts.tm_year + 1900, parts.tm_mon + 1, parts.tm_mday, parts.tm_hour,
          parts.tm_min,         parts.tm_sec,     parts.tm_wday};
}

}  // namespace fotomill::platform
