#include "desktop/models/metadata/file_time_choice.h"

#include <cstdio>
#include <optional>

#include "core/whole_number.h"
#include "metadata/edit/exif_dates.h"
#include "platform/clock.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int32_t kSecondsOfMinute = 60, kSecondsOfHour = 3600;

// Seconds, or a difference with or without a plus.
std::optional<int64_t> ParseStep(const std::string& text) {
  if (const auto seconds = ParseNumber<int64_t>(text)) return seconds;
  const auto step = ParseTimeShift(text);
  return step ? step : ParseTimeShift("+" + text);
}

std::string StepText(int32_t seconds) {
  char text[48];
  const uint32_t size =
      seconds < 0 ? 0u - static_cast<uint32_t>(seconds) : static_cast<uint32_t>(seconds);
  std::snprintf(text, sizeof text, "%s%u:%02u:%02u", seconds < 0 ? "-" : "", size / kSecondsOfHour,
                size / kSecondsOfMinute % 60, size % 60);
  return text;
}

}  // namespace

FileTimeChoice FileTimeChoiceFromSettings() {
  const FileTimeRule rule = FileTimeRuleFromSettings();
  return {.time = LocalTimeText(rule.start.value_or(platform::Now())),
          .sequence = settings.FileTimeSequential != 0,
          .step = StepText(settings.FileTimeIncrement),
          .modification = rule.setsModification,
          .access = rule.setsAccess};
}

void StoreFileTimeChoice(const FileTimeChoice& choice) {
  settings.FileTimeUpdateWrite = choice.modification ? 1 : 0;
  settings.FileTimeUpdateAccess = choice.access ? 1 : 0;
  settings.FileTimeSequential = choice.sequence ? 1 : 0;
  const auto step = ParseStep(choice.step);
  if (step && *step >= INT32_MIN && *step <= INT32_MAX)
    settings.FileTimeIncrement = static_cast<int32_t>(*step);
  const auto time = ParseLocalTime(choice.time);
  if (choice.source != FileTimeSource::Given || !time) return;
  const platform::LocalTime local = platform::LocalTimeOf(*time);
  settings.FileTimeYear = local.year;
  settings.FileTimeMonth = local.month;
  settings.FileTimeDay = local.day;
  settings.FileTimeHour = local.hour;
  settings.FileTimeMinute = local.minute;
  settings.FileTimeSecond = local.second;
}

std::string ReadFileTimeRule(const FileTimeChoice& choice, FileTimeRule& rule) {
  rule = {.taken = choice.source == FileTimeSource::Taken,
          .setsAccess = choice.access,
          .setsModification = choice.modification};
  if (!choice.access && !choice.modification) return Tr("Choose which of the times is set.");
  if (choice.source == FileTimeSource::Given) {
    rule.start = ParseLocalTime(choice.time);
    if (!rule.start) return Tr("\"%1\" is not a time like %2.", choice.time, "2024-05-31 14:03:09");
  }
  const bool follows = choice.source == FileTimeSource::FirstFile ||
                       (choice.source == FileTimeSource::Given && choice.sequence);
  if (!follows) return {};
  const auto step = ParseStep(choice.step);
  if (!step) return Tr("\"%1\" is not a time difference like %2.", choice.step, "0:00:10");
  rule.increment = *step;
  return {};
}

void PreviewFileTimes(std::span<const std::string> files, const FileTimeRule& rule,
                      const TagSources& sources, const StopToken& stop,
                      const std::function<void(const FileTimeRow& row)>& report) {
  FileTimeChanger changer(rule, true);
  for (const std::string& file : files) {
    if (stop.Asked()) return;
    FileTimeChange change;
    PictureTags tags;
    if (rule.taken) change.status = ReadPictureTags(file, sources, tags);
    if (change.status == Status::Ok) change = changer.Change(file, tags.taken);
    FileTimeRow row{.path = file, .before = {}, .after = {}, .problem = {}};
    if (change.before.seconds != 0) row.before = LocalTimeText(change.before.seconds);
    if (change.status == Status::Ok) {
      row.after = LocalTimeText(change.after.seconds);
    } else {
      row.problem = change.hint.empty() ? StatusText(change.status) : change.hint;
    }
    report(row);
  }
}

}  // namespace fotomill::desktop
