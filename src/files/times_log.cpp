#include "files/times_log.h"

#include <array>
#include <charconv>
#include <string_view>

namespace fotomill {

namespace {

constexpr const char* kLogName = "FMWTimesUndo.dat";

// The numbers of a record: seconds and nanoseconds of the modification before and after, then of
// the access, if that was set.
using Numbers = std::array<int64_t, 8>;
constexpr size_t kModificationOnly = 4;

UndoRecord RecordOf(const ChangedTimes& file) {
  std::string text;
  const auto add = [&text](const platform::ExactTime& time) {
    text.append(text.empty() ? "" : " ").append(std::to_string(time.seconds));
    text.append(" ").append(std::to_string(time.nanoseconds));
  };
  add(file.before.modified);
  add(file.after.modified);
  if (file.before.accessed && file.after.accessed) {
    add(*file.before.accessed);
    add(*file.after.accessed);
  }
  return {file.path, text};
}

std::optional<ChangedTimes> Parsed(const UndoRecord& record) {
  Numbers numbers = {};
  size_t count = 0;
  const char* at = record.second.data();
  const char* const end = at + record.second.size();
  for (; at < end && count < numbers.size(); ++count) {
    const auto [next, error] = std::from_chars(at, end, numbers[count]);
    if (error != std::errc() || (next != end && *next != ' ')) return std::nullopt;
    at = next == end ? end : next + 1;
  }
  const bool accessed = count == numbers.size();
  if (at != end || (count != kModificationOnly && !accessed)) return std::nullopt;
  const auto time = [&](size_t i) { return platform::ExactTime{numbers[i], numbers[i + 1]}; };
  ChangedTimes file{record.first, {{}, time(0)}, {{}, time(2)}};
  if (accessed) file.before.accessed = time(4);
  if (accessed) file.after.accessed = time(6);
  return file;
}

}  // namespace

TimesLog::TimesLog() : log_(kLogName) {}

bool TimesLog::Intend(const ChangedTimes& file) { return log_.Intend(RecordOf(file)); }

std::optional<std::vector<ChangedTimes>> ReadTimesLog() {
  const auto records = ReadUndoLog(kLogName);
  if (!records) return std::nullopt;
  std::vector<ChangedTimes> files;
  for (const UndoRecord& record : *records) {
    if (const auto file = Parsed(record)) files.push_back(*file);
  }
  return files;
}

bool WriteTimesLog(const std::vector<ChangedTimes>& files) {
  std::vector<UndoRecord> records;
  for (const ChangedTimes& file : files) records.push_back(RecordOf(file));
  return WriteUndoLog(kLogName, records);
}

}  // namespace fotomill
