#include "files/file_time_change.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>

#include "core/checked.h"
#include "core/text.h"
#include "platform/clock.h"
#include "platform/file_times.h"
#include "platform/folders.h"
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

constexpr int64_t kCoarsest = 2;  // seconds, on FAT

// Whether a file has a time; file systems silently use the nearest one that they can store.
bool Holds(const std::string& path, int64_t seconds) {
  const auto time = platform::ModificationTime(path);
  return !time || std::abs(time->seconds - seconds) <= kCoarsest;
}

// Whether a file with the time `found` may have been given the time `set`. File systems keep
// nanoseconds, hundredths of a second, or seconds.
bool IsStoredAs(const platform::ExactTime& found, const platform::ExactTime& set) {
  constexpr int64_t kNanoseconds = 1'000'000'000, kHundredth = 10'000'000;
  if (std::abs(found.seconds - set.seconds) > kCoarsest) return false;
  const int64_t off =
      (found.seconds - set.seconds) * kNanoseconds + found.nanoseconds - set.nanoseconds;
  return std::abs(off) < (found.nanoseconds == 0 ? kCoarsest * kNanoseconds : kHundredth);
}

}  // namespace

// Sets the times of `changed`.
void FileTimeChanger::Set(FileTimeChange& change) {
  const ChangedTimes& changed = change.changed;
  const auto modified =
      rule_.setsModification ? std::optional(changed.after.modified) : std::nullopt;
  change.logged = log_ == nullptr || log_->Intend(changed);
  if (!platform::SetFileTimes(changed.path, changed.after.accessed, modified)) {
    change.status = Status::ErrorWritingFile;
    change.hint = ReasonSentence();
  } else if (modified && !Holds(changed.path, modified->seconds)) {
    (void)platform::SetFileTimes(changed.path, changed.before.accessed, changed.before.modified);
    change.status = Status::ErrorWritingFile;
    change.hint = Tr("The file system cannot store this time.");
  }
  if (log_ != nullptr) log_->Settle(change.status == Status::Ok);
}

FileTimeChange FileTimeChanger::Change(const std::string& path, int64_t taken) {
  FileTimeChange change;
  const auto times = platform::FileTimesOf(path);
  if (!times || !platform::IsRegularFile(path)) {
    change.status = Status::FileOpenError;
    change.hint = times ? std::string() : ReasonSentence();
    return change;
  }
  change.before = times->modified;
  int64_t when = rule_.start.value_or(change.before.seconds);
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
  change.after = {when, !rule_.taken && !rule_.start ? change.before.nanoseconds : 0};
  change.changed = {platform::AbsolutePath(path), {{}, change.before}, {{}, change.before}};
  if (rule_.setsAccess) change.changed.before.accessed = times->accessed;
  if (rule_.setsAccess) change.changed.after.accessed = change.after;
  if (rule_.setsModification) change.changed.after.modified = change.after;
  if (!dryRun_) Set(change);
  if (change.status != Status::Ok) return change;
  rule_.start = when;
  begun_ = true;
  return change;
}

FileTimeChange UndoTimes(const ChangedTimes& changed, bool dryRun) {
  FileTimeChange change{.after = changed.before.modified, .changed = changed};
  const auto now = platform::FileTimesOf(changed.path);
  if (!now) {
    change.status = Status::FileOpenError;
    change.hint = ReasonSentence();
    return change;
  }
  change.before = now->modified;
  // if it has the old time, the program was ended before it set the new one
  if (!IsStoredAs(now->modified, changed.after.modified) &&
      now->modified != changed.before.modified) {
    change.status = Status::ErrorWritingFile;
    change.hint = Tr("It was changed since, so it was left alone.");
  } else if (!dryRun && !platform::SetFileTimes(changed.path, changed.before.accessed,
                                                changed.before.modified)) {
    change.status = Status::ErrorWritingFile;
    change.hint = ReasonSentence();
  }
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
