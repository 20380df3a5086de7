#include "cli/commands/history.h"

#include <memory>
#include <string>
#include <vector>

#include "catalog/history/file_history.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/nearest_name.h"
#include "core/whole_number.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "settings/job_options.h"
#include "settings/settings.h"

namespace fotomill::cli {

namespace {

struct HistoryOptions {
  std::string function;
  int32_t created = kOwnTime;
  int32_t accessed = kOwnTime;
  bool json = false;
  bool dryRun = false;
};

constexpr std::string_view kNotRead =
    "The file history is there but cannot be read as one, so it was left as it is; \"history clear\" removes it.";
constexpr std::string_view kNotWritten = "The file history could not be written.";

int Complain(const CommandContext& context, std::string_view message) {
  ResultOutput output(context, false);
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  output.Note((path.empty() ? "fotomill" : output.ShownMessage(path)) + ": " + std::string(message));
  return kExitFailed;
}

std::string TimeText(int64_t seconds) {
  const platform::LocalTime time = platform::LocalTimeOf(seconds);
  char text[40];
  std::snprintf(text, sizeof text, "%04d-%02d-%02d %02d:%02d:%02d", time.year, time.month, time.day, time.hour, time.minute,
                time.second);
  return text;
}

int RunList(const HistoryOptions& options, const CommandContext& context) {
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  ResultOutput output(context, options.json);
  const bool read = LoadFileHistory(HistoryOptionsFromSettings());
  for (size_t i = 0; i < FileHistoryCount() && output.GoesOn(); ++i) {
    const FileHistoryEntry entry = FileHistoryAt(i);
    const std::string name(FileFunctionName(entry.function));
    if (!output.IsJson()) {
      output.Line(TimeText(entry.accessed) + "\t" + name + "\t" + output.Shown(entry.path));
      continue;
    }
    Json element;
    PutName(element, "path", entry.path);
    element["function"] = entry.function;
    element["functionName"] = name;
    element["created"] = entry.created;
    element["accessed"] = entry.accessed;
    element["size"] = entry.size;
    output.Element(element);
  }
  ClearFileHistory();
  if (settings.FileHistoryEnable == 0) output.Note("The file history is switched off.");
  const bool broken = !read && settings.FileHistoryEnable != 0 && !path.empty() && platform::FileExists(path);
  return broken ? Complain(context, kNotRead) : kExitOk;
}

// The function that a text names, by its name or its number; kNoFileFunction when it names none.
int32_t FunctionOf(const std::string& text) {
  const auto number = ParseNumber<int32_t>(text);
  if (!number) return FileFunctionOfName(text);
  return FileFunctionName(*number).empty() ? kNoFileFunction : *number;
}

std::string UnknownFunction(const std::string& text) {
  std::vector<std::string_view> names;
  for (int32_t i = 0; i < kFileFunctionCount; ++i) names.push_back(FileFunctionName(i));
  return "There is no function \"" + text + "\"; functions are 0 to 19 or their names." + NearestNameHint(text, names);
}

int RunAdd(const HistoryOptions& options, const CommandContext& context) {
  const int32_t function = FunctionOf(options.function);
  if (function == kNoFileFunction) return UsageError(context, UnknownFunction(options.function));
  ResultOutput output(context, options.json);
  const std::string& name = context.names.values[0];
  const FileUse use{platform::AbsolutePath(name), static_cast<FileFunction>(function), options.created, options.accessed, false};
  Status status = Status::Ok;
  std::string hint;
  if (!platform::IsRegularFile(use.path)) {
    status = Status::FileOpenError;
  } else if (!FitsFileHistory(use.path)) {
    status = Status::InvalidDestination;
    hint = "The file history holds paths of at most 260 bytes without tabs and line ends.";
  }
  if (status != Status::Ok) {
    output.Failure(name, status, hint);
    return output.Finish();
  }
  const std::string line = output.ShownMessage(name) + ": ";
  if (options.dryRun) {
    output.Note(line + "would be recorded under " + std::string(FileFunctionName(function)) + ".");
    return kExitOk;
  }
  size_t recorded = 0;
  switch (UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}, &recorded)) {
    case HistoryUpdate::Off: output.Note("The file history is switched off."); return kExitOk;
    case HistoryUpdate::NotRead: return Complain(context, kNotRead);
    case HistoryUpdate::Failed: return Complain(context, kNotWritten);
    case HistoryUpdate::Done: break;
  }
  if (recorded == 0) output.Note(line + "not recorded, FileHistoryFunctions leaves this function out.");
  return kExitOk;
}

int RunClear(const HistoryOptions& options, const CommandContext& context) {
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  ClearFileHistory();
  if (path.empty() || !platform::FileExists(path)) return kExitOk;
  if (options.dryRun) {
    ResultOutput(context, false).Note(path + ": would be deleted.");
    return kExitOk;
  }
  return platform::DeleteFile(path) ? kExitOk : Complain(context, "The file history could not be deleted.");
}

using Run = int (*)(const HistoryOptions& options, const CommandContext& context);

std::shared_ptr<HistoryOptions> SetUp(CLI::App& app, CommandContext& context, Run run, const char* example) {
  auto options = std::make_shared<HistoryOptions>();
  SetFooter(app, std::string("Example: ") + example);
  context.run = [options, &context, run] { return run(*options, context); };
  return options;
}

}  // namespace

void SetUpHistoryList(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunList, "fotomill history list --json");
  AddFlag(app, "--json", options->json, "One JSON array of {path, function, functionName, created, accessed, size}");
}

void SetUpHistoryAdd(CLI::App& app, CommandContext& context) {
  context.names.Declare("FILE", "The picture file that was used", 1, 1);
  const auto options = SetUp(app, context, RunAdd, "fotomill history add photo.jpg --function View");
  Require(AddName(app, "--function", options->function, "NAME|N",
                  "What was done: a name such as \"Get info\", or a number from 0 to 19"));
  AddNumber(app, "--created", options->created, "SECONDS", INT32_MIN, INT32_MAX,
            "When the file was made, in seconds since 1970 UTC; else its own time");
  AddNumber(app, "--accessed", options->accessed, "SECONDS", INT32_MIN, INT32_MAX,
            "When it was used, in seconds since 1970 UTC; else now");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only tell what would be recorded");
}

void SetUpHistoryClear(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunClear, "fotomill history clear");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only tell what would be deleted");
}

}  // namespace fotomill::cli
