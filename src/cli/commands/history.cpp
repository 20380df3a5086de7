#include "cli/commands/history.h"

#include <memory>
#include <string>
#include <vector>

#include "catalog/history/file_history.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "core/whole_number.h"
#include "files/file_time_change.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/name_hint.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct HistoryOptions {
  std::string function;
  int32_t created = kOwnTime;
  int32_t accessed = kOwnTime;
  bool json = false;
  bool dryRun = false;
};

constexpr const char* kNotRead =
    TrLater("Not a readable file history; left unchanged. \"history clear\" deletes it.");
constexpr const char* kNotWritten = TrLater("The file history could not be written.");
constexpr const char* kOff = TrLater("The file history is disabled.");

int Complain(const CommandContext& context, const char* message) {
  ResultOutput output(context, false);
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  output.Note((path.empty() ? "fotomill" : output.ShownMessage(path)) + ": " +
              WithReason(Tr(message)));
  return kExitFailed;
}

int RunList(const HistoryOptions& options, const CommandContext& context) {
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  ResultOutput output(context, options.json);
  const bool read = LoadFileHistory(HistoryOptionsFromSettings());
  for (size_t i = 0; i < FileHistoryCount() && output.GoesOn(); ++i) {
    const FileHistoryEntry entry = FileHistoryAt(i);
    const std::string name(FileFunctionName(entry.function));
    if (!output.IsJson()) {
      output.Line(LocalTimeText(entry.accessed) + "\t" + name + "\t" + output.Shown(entry.path));
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
  if (settings.FileHistoryEnable == 0) output.Note(Tr(kOff));
  const bool broken =
      !read && settings.FileHistoryEnable != 0 && !path.empty() && platform::FileExists(path);
  return broken ? Complain(context, kNotRead) : kExitOk;
}

// Finds a function by name or number; kNoFileFunction if there is none.
int32_t FunctionOf(const std::string& text) {
  const auto number = ParseNumber<int32_t>(text);
  if (!number) return FileFunctionOfName(text);
  return FileFunctionName(*number).empty() ? kNoFileFunction : *number;
}

std::string UnknownFunction(const std::string& text) {
  std::vector<std::string_view> names;
  for (int32_t i = 0; i < kFileFunctionCount; ++i) names.push_back(FileFunctionName(i));
  return Tr("Unknown function \"%1\"; use a number from 0 to %2 or a name.", text,
            kFileFunctionCount - 1) +
         NearestNameHint(text, names);
}

int RunAdd(const HistoryOptions& options, const CommandContext& context) {
  const int32_t function = FunctionOf(options.function);
  if (function == kNoFileFunction) return UsageError(context, UnknownFunction(options.function));
  ResultOutput output(context, options.json);
  const std::string& name = context.names.values[0];
  const FileUse use{platform::AbsolutePath(name), static_cast<FileFunction>(function),
                    options.created, options.accessed, false};
  Status status = Status::Ok;
  std::string hint;
  if (!platform::IsRegularFile(use.path)) {
    status = Status::FileOpenError;
  } else if (!FitsFileHistory(use.path)) {
    status = Status::InvalidDestination;
    hint = Tr("The file history takes paths of up to 260 bytes, without tabs and line breaks.");
  }
  if (status != Status::Ok) {
    output.FileFailed(name, status, hint);
    return output.Finish();
  }
  const std::string line = output.ShownMessage(name) + ": ";
  if (options.dryRun) {
    output.Note(line + Tr("would be recorded as \"%1\".", FileFunctionName(function)));
    return kExitOk;
  }
  size_t recorded = 0;
  switch (UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}, &recorded)) {
    case HistoryUpdate::Off: output.Note(Tr(kOff)); return kExitOk;
    case HistoryUpdate::NotRead: return Complain(context, kNotRead);
    case HistoryUpdate::Failed: return Complain(context, kNotWritten);
    case HistoryUpdate::Done: break;
  }
  if (recorded == 0)
    output.Note(line + Tr("not recorded; FileHistoryFunctions excludes this function."));
  if (output.IsJson()) {
    Json element;
    PutName(element, "path", use.path);
    element["function"] = function;
    element["functionName"] = FileFunctionName(function);
    element["recorded"] = recorded > 0;
    output.Element(element);
  }
  return kExitOk;
}

int RunClear(const HistoryOptions& options, const CommandContext& context) {
  const std::string path = FileHistoryPath(HistoryOptionsFromSettings());
  ClearFileHistory();
  ResultOutput output(context, options.json);
  if (path.empty() || !platform::FileExists(path)) return kExitOk;
  if (options.dryRun) {
    output.Note(output.ShownMessage(path) + ": " + Tr("would be deleted."));
  } else if (!platform::DeleteFile(path)) {
    return Complain(context, TrLater("The file history could not be deleted."));
  }
  if (output.IsJson()) {
    Json element;
    PutName(element, "path", path);
    element["deleted"] = !options.dryRun;
    output.Element(element);
  }
  return kExitOk;
}

using Run = int (*)(const HistoryOptions& options, const CommandContext& context);

std::shared_ptr<HistoryOptions> SetUp(CLI::App& app, CommandContext& context, Run run,
                                      const char* example) {
  auto options = std::make_shared<HistoryOptions>();
  SetFooter(app, nullptr, example);
  context.run = [options, &context, run] { return run(*options, context); };
  return options;
}

}  // namespace

void SetUpHistoryList(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunList, "fotomill history list --json");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {path, function, functionName, created, accessed, size}");
}

void SetUpHistoryAdd(CLI::App& app, CommandContext& context) {
  context.names.Declare("FILE", "The file that was used", 1, 1);
  const auto options =
      SetUp(app, context, RunAdd, "fotomill history add photo.jpg --function View");
  Require(AddName(
      app, "--function", options->function, "NAME|N",
      "What was done with it: a function name such as \"Get info\", or a number from 0 to 19"));
  AddNumber(app, "--created", options->created, "SECONDS", INT32_MIN, INT32_MAX,
            "When the file was created, in seconds since 1970 UTC (default: its own time)");
  AddNumber(app, "--accessed", options->accessed, "SECONDS", INT32_MIN, INT32_MAX,
            "When it was used, in seconds since 1970 UTC (default: now)");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be recorded");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {path, function, functionName, recorded}");
}

void SetUpHistoryClear(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunClear, "fotomill history clear");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be deleted");
  AddFlag(app, "--json", options->json, "Print a JSON array of {path, deleted}");
}

}  // namespace fotomill::cli
