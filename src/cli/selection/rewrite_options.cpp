#include "cli/selection/rewrite_options.h"

#include "batch/new_job.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/selection/output_place.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// Returns an error message, empty if the options are valid.
std::string CheckOptions(const RewriteOptions& options) {
  if (!options.inPlace && options.dest.empty() && options.out.empty())
    return Tr("Choose --dest DIR, --out FILE or --in-place.");
  if (options.keepTree && options.dest.empty()) return Tr("--keep-tree needs --dest.");
  if (!options.dest.empty() && platform::ExistenceOf(options.dest) == platform::Existence::Yes &&
      !platform::IsFolder(options.dest)) {
    return Tr("\"%1\" is not a folder.", options.dest);
  }
  return {};
}

// Checks --out for these files. Returns an error message, empty if valid.
std::string CheckOut(const std::string& out, const std::vector<SelectedFile>& files,
                     const char* command) {
  if (out.empty()) return {};
  if (files.size() != 1) return Tr("--out takes exactly one picture.");
  const bool sameFormat = FindFormatByName(out) == FindFormatByName(files.front().name);
  return sameFormat ? std::string()
                    : Tr("\"%1\" must have the extension of its source: %2 keeps the format.", out,
                         command);
}

}  // namespace

void AddRewriteOptions(CLI::App& app, RewriteOptions& options) {
  CLI::Option* dest =
      AddName(app, "-d,--dest", options.dest, "DIR", "Output folder, created if needed");
  CLI::Option* out = AddName(app, "-o,--out", options.out, "FILE",
                             "Output file, for a single picture; FOLDER/ is --dest FOLDER");
  CLI::Option* inPlace = AddFlag(app, "--in-place", options.inPlace, "Replace each file");
  Exclude(inPlace, dest);
  Exclude(inPlace, out);
  Exclude(out, dest);
  AddChoice(app, "--overwrite", options.overwrite, "HOW",
            "If the output exists in --dest: keep-both (default), replace or skip",
            {"keep-both", "replace", "skip"});
  AddFlag(app, "--keep-tree", options.keepTree, "Recreate the source folders in --dest");
  AddFlag(app, "--keep-times", options.keepTimes, "Keep the modification times of the sources");
  AddNumber(app, "-j,--jobs", options.jobs, "N", 0, INT32_MAX,
            "Number of parallel jobs (default: 0, one per core)");
  AddFlag(app, "-n,--dry-run", options.dryRun, "Only show what would be done");
  AddFlag(app, "--json", options.json,
          "Print a JSON array of {file, destination, status, message}");
}

RewriteFunction RewriteFunctionOf(const RewriteOptions& options) {
  RewriteFunction function;
  function.inPlace = options.inPlace;
  function.out = options.out;
  function.keepTree = options.keepTree;
  function.keepTimes = options.keepTimes;
  function.dryRun = options.dryRun;
  function.jobs = static_cast<uint32_t>(options.jobs);
  return function;
}

std::optional<Selection> SelectForRewrite(RewriteOptions& options, const CommandContext& context) {
  TakeFolder(options.out, options.dest);
  std::string wrong = CheckOptions(options);
  std::optional<Selection> selection;
  if (wrong.empty()) {
    selection = SelectFiles(options.selection, context);
    if (!selection) return {};
    wrong = CheckOut(options.out, selection->files, context.command->name);
  }
  if (wrong.empty()) return selection;
  (void)UsageError(context, wrong);
  return {};
}

int RunRewriteJob(const RewriteOptions& options, const Selection& selection,
                  const CommandContext& context, const std::function<void(BatchJob& job)>& start) {
  BatchJob job = NewBatchJob();
  job.destinationFolder = options.dest;
  job.overwrite.prompt = options.overwrite != "replace";
  job.overwrite.skip = options.overwrite == "skip";
  ResultOutput output(context, options.json);
  output.CloseWith(selection.leftOut);
  TerminalBox box(output, true, false);
  job.box = &box;
  start(job);
  return FinishBatch(job, context);
}

}  // namespace fotomill::cli
