#include "platform/file_times.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <ctime>

#include "platform/fault.h"
#include "platform/posix/kept_reason.h"

namespace fotomill::platform {

std::optional<int64_t> SecondsOfLocalTime(const LocalTime& time) {
  const bool inRange = time.month >= 1 && time.month <= 12 && time.day >= 1 && time.day <= 31 &&
                       time.hour >= 0 && time.hour <= 23 && time.minute >= 0 &&
                       time.minute <= 59 && time.second >= 0 && time.second <= 60;
  struct tm parts = {};
  parts.tm_year = time.year - 1900;
  parts.tm_mon = time.month - 1;
  parts.tm_mday = time.day;
  parts.tm_hour = time.hour;
  parts.tm_min = time.minute;
  parts.tm_sec = time.second;
  parts.tm_isdst = -1;
  parts.tm_wday = -1;  // set on success; -1 as a result is a valid time
  const time_t seconds = mktime(&parts);
  if (!inRange || parts.tm_wday == -1) return std::nullopt;
  return seconds;
}

std::optional<FileTimes> FileTimesOf(const std::string& path) {
  struct stat facts = {};
  if (FaultDue() || stat(path.c_str(), &facts) != 0) {
    KeepErrno();
    return std::nullopt;
  }
  const auto time = [](const timespec& t) { return ExactTime{t.tv_sec, t.tv_nsec}; };
  return FileTimes{time(facts.st_atim), time(facts.st_mtim)};
}

bool SetFileTimes(const std::string& path, std::optional<ExactTime> accessed,
                  std::optional<ExactTime> modified) {
  const auto time = [](const std::optional<ExactTime>& wanted) {
    return wanted ? timespec{wanted->seconds, wanted->nanoseconds} : timespec{0, UTIME_OMIT};
  };
  const timespec times[2] = {time(accessed), time(modified)};
  if (!FaultDue() && utimensat(AT_FDCWD, path.c_str(), times, 0) == 0) return true;
  KeepErrno();
  return false;
}

}  // namespace fotomill::platform
