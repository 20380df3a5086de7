#include "cli/commands/touch.h"

#include <algorithm>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/selection/file_selection.h"
#include "core/whole_number.h"
#include "files/file_time_change.h"
#include "metadata/edit/exif_dates.h"
#include "metadata/tags/picture_tags.h"
#include "platform/folders.h"
#include "settings/job_options.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr const char* kNotLogged = TrLater("It could not be recorded for --undo.");

struct TouchOptions {
  SelectionOptions selection;
  bool taken = false;
  std::string at, increment;
  bool undo = false;
  bool dryRun = false;
  bool json = false;
};

// The rule from the settings, overridden by the options. Returns an error message, empty if valid.
std::string ReadRule(const TouchOptions& options, FileTimeRule& rule) {
  rule = FileTimeRuleFromSettings();
  rule.taken = options.taken;
  if (options.taken) rule.increment = 0;
  if (!options.at.empty()) {
    rule.start = ParseLocalTime(options.at);
    if (!rule.start)
      return Tr("\"%1\" is not a time like %2.", options.at, "\"2024-05-31 14:03:09\"");
  }
  if (!options.increment.empty()) {
    auto step = ParseNumber<int64_t>(options.increment);  // seconds
    if (!step) step = ParseTimeShift(options.increment);
    if (!step) step = ParseTimeShift("+" + options.increment);
    if (!step) return Tr("\"%1\" is not a time difference like %2.", options.increment, "0:00:10");
    rule.increment = *step;
    if (options.at.empty()) rule.start.reset();
  }
  return rule.setsAccess || rule.setsModification
             ? std::string()
             : Tr("No time is set, as the keys FileTimeUpdateAccess and FileTimeUpdateWrite are "
                  "off.");
}

void Report(ResultOutput& output, const std::string& name, const FileTimeChange& change) {
  const bool known = change.status == Status::Ok;
  const std::string before = LocalTimeText(change.before.seconds);
  const std::string after = LocalTimeText(change.after.seconds);
  if (output.IsJson()) {
    Json element;
    PutName(element, "file", name);
    element["before"] = known ? Json(before) : Json();
    element["after"] = known ? Json(after) : Json();
    PutStatus(element, change.status);
    output.Element(element);
  }
  if (!known) return output.Failure(name, change.status, change.hint);
  if (!output.IsJson()) output.Line(output.Shown(name) + ": " + before + " -> " + after);
  if (!change.logged) output.Message(output.Shown(name) + ": " + Tr(kNotLogged));
  output.CountFile();
}

// Gives the files of the last run their old times, the last one first; with a selection only those
// in it. What cannot be undone stays in the log.
int RunUndo(const TouchOptions& options, const CommandContext& context) {
  const bool all = context.names.values.empty() && options.selection.filesFrom.empty();
  std::set<std::string> only;
  if (!all) {
    const auto chosen = SelectFiles(options.selection, context);
    if (!chosen) return kExitUsage;
    for (const SelectedFile& file : chosen->files) only.insert(platform::AbsolutePath(file.name));
  }
  ResultOutput output(context, options.json);
  output.KeepGoing();
  TimesLog lock;
  auto log = options.dryRun || lock.LockForUndo() ? ReadTimesLog() : std::nullopt;
  if (!log) {
    output.Message(std::string("fotomill: ") +
                   WithReason(Tr("The record of the last changes of file times, in the data "
                                 "folder, cannot be read.")));
    return std::max(output.Finish(), static_cast<int>(kExitFailed));
  }
  const auto wanted = [&](const ChangedTimes& file) {
    return all || only.contains(file.path);
  };
  output.Expect(static_cast<size_t>(std::ranges::count_if(*log, wanted)));
  if (log->empty()) return output.Finish();  // another run may be starting one
  std::vector<ChangedTimes> left;
  for (; !log->empty(); log->pop_back()) {
    const ChangedTimes& file = log->back();
    bool undone = false;
    if (wanted(file) && output.GoesOn()) {
      const FileTimeChange change = UndoTimes(file, options.dryRun);
      Report(output, file.path, change);
      undone = change.status == Status::Ok;
    }
    if (!undone) left.push_back(file);
  }
  std::ranges::reverse(left);
  if (!options.dryRun && !WriteTimesLog(left)) output.Message(WithReason(Tr(kNotLogged)));
  return output.Finish();
}

int RunTouch(const TouchOptions& options, const CommandContext& context) {
  if (options.undo) return RunUndo(options, context);
  FileTimeRule rule;
  const std::string wrong = ReadRule(options, rule);
  if (!wrong.empty()) return UsageError(context, wrong);
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  ResultOutput output(context, options.json);
  output.KeepGoing();
  output.CloseWith(selection->leftOut);
  output.Expect(selection->files.size());
  TimesLog log;
  FileTimeChanger changer(rule, options.dryRun, &log);
  const TagSources sources = TagSourcesFromSettings();
  for (const SelectedFile& file : selection->files) {
    if (!output.GoesOn()) break;
    FileTimeChange change{.status = file.status, .hint = file.hint};
    PictureTags tags;
    if (change.status == Status::Ok && rule.taken)
      change.status = ReadPictureTags(file.name, sources, tags);
    if (change.status == Status::Ok) change = changer.Change(file.name, tags.taken);
    Report(output, file.name, change);
  }
  return output.Finish();
}

}  // namespace

void SetUpTouch(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<TouchOptions>();
  AddSelection(app, options->selection, context);
  CLI::Option* taken = AddFlag(app, "--taken", options->taken,
                               "Set the time when the picture was taken, by local time");
  CLI::Option* at = AddName(app, "--at", options->at, "TIME",
                            "Set this local time, as \"2024-05-31 14:03:09\", or now");
  CLI::Option* increment = AddName(
      app, "--increment", options->increment, "STEP",
      "Set each file later than the one before, by seconds or as 0:01:30; the first one to --at "
      "(default: its own time)");
  Exclude(at, taken);
  Exclude(increment, taken);
  CLI::Option* undo = AddFlag(app, "--undo", options->undo,
                              "Give the files of the last run, or the named ones of these, their "
                              "old times again");
  for (CLI::Option* option : {taken, at, increment}) Exclude(undo, option);
  AddDryRunAndJson(app, options->dryRun, options->json,
                   "Print a JSON array of {file, before, after, status, message}");
  SetFooter(app,
            "Prints the old and the new time of each file. Without --taken, --at and --increment, "
            "the FileTime keys apply: FileTimeYear to FileTimeSecond, or now if the year is 0, and "
            "FileTimeIncrement if FileTimeSequential is on. FileTimeUpdateWrite and "
            "FileTimeUpdateAccess select the times that are set.",
            "fotomill touch -r --taken holiday");
  context.run = [options, &context] { return RunTouch(*options, context); };
}

}  // namespace fotomill::cli
