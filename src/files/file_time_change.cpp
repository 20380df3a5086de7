#include "files/file_time_change.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>

#include "core/checked.h"
#include "core/text.h"
#include "platform/clock.h"
#include "platform/file_times.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// The moment of a date like 20040831223208, by local time.
std::optional<int64_t> SecondsOfDate(int64_t date) {
  const auto take = [&date](int64_t unit) {
    const auto part = static_cast<int32_t>(date % unit);
    date /= unit;
    return part;
  };
  platform::LocalTime time;
  time.second = take(100);
  time.minute = take(100);
  time.hour = take(100);
  time.day = take(100);
  time.month = take(100);
  time.year = take(10000);
  const std::chrono::year_month_day day(std::chrono::year(time.year),
                                        std::chrono::month(static_cast<unsigned>(time.month)),
                                        std::chrono::day(static_cast<unsigned>(time.day)));
  return day.ok() ? platform::SecondsOfLocalTime(time) : std::nullopt;
}

// Whether a file has a time; file systems silently use the nearest one that they can store.
bool Holds(const std::string& path, int64_t seconds) {
  constexpr int64_t kCoarsest = 2;  // seconds, on FAT
  const auto time = platform::ModificationTime(path);
  return !time || std::abs(time->seconds - seconds) <= kCoarsest;
}

}  // namespace

FileTimeChange FileTimeChanger::Change(const std::string& path, int64_t taken) {
  FileTimeChange change;
  const auto before = platform::ModificationTime(path);
  if (!before || !platform::IsRegularFile(path)) {
    change.status = Status::FileOpenError;
    change.hint = before ? std::string() : ReasonSentence();
    return change;
  }
  change.before = *before;
  int64_t when = rule_.start.value_or(before->seconds);
  if (rule_.taken) {
    const auto date = taken > 0 ? SecondsOfDate(taken) : std::nullopt;
    if (!date) {
      change.status = Status::InformationError;
      change.hint = Tr("It does not say when it was taken.");
      return change;
    }
    when = *date;
  } else if (begun_ && !CheckedAdd(when, rule_.increment, when)) {
    change.status = Status::InformationError;
    return change;
  }
  change.after = {when, !rule_.taken && !rule_.start ? before->nanoseconds : 0};
  const auto time = [&](bool set) { return set ? std::optional(change.after) : std::nullopt; };
  if (!dryRun_ &&
      !platform::SetFileTimes(path, time(rule_.setsAccess), time(rule_.setsModification))) {
    change.status = Status::ErrorWritingFile;
    change.hint = ReasonSentence();
    return change;
  }
  if (!dryRun_ && rule_.setsModification && !Holds(path, when)) {
    (void)platform::SetFileTimes(path, {}, before);
    change.status = Status::ErrorWritingFile;
    change.hint = Tr("The file system cannot store this time.");
    return change;
  }
  rule_.start = when;
  begun_ = true;
  return change;
}

std::optional<int64_t> ParseLocalTime(std::string_view text) {
  if (EqualIgnoringCase(text, "now")) return platform::Now();
  constexpr std::string_view kForm = "0000-00-00 00:00:00";
  if (text.size() != 10 && text.size() != 16 && text.size() != kForm.size()) return std::nullopt;
  int64_t date = 0;
  for (size_t i = 0; i < kForm.size(); ++i) {
    const char c = i < text.size() ? text[i] : kForm[i];
    if (IsDigit(c) != (kForm[i] == '0')) return std::nullopt;
    if (IsDigit(c)) date = date * 10 + (c - '0');
    const bool other = (i < 10 && c == ':') || (i == 10 && c == 'T');
    if (!IsDigit(c) && c != kForm[i] && !other) return std::nullopt;
  }
  return SecondsOfDate(date);
}

std::string LocalTimeText(int64_t seconds) {
  const platform::LocalTime time = platform::LocalTimeOf(seconds);
  char text[64];
  std::snprintf(text, sizeof text, "%04d-%02d-%02d %02d:%02d:%02d", time.year, time.month, time.day,
                time.hour, time.minute, time.second);
  return text;
}

}  // namespace fotomill
