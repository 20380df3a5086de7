#include "cli/commands/rename.h"

#include <algorithm>
#include <memory>
#include <set>
#include <string>

#include "batch/new_job.h"
#include "batch/sequential_rename.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/selection/file_selection.h"
#include "platform/folders.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct RenameCommandOptions {
  SelectionOptions selection;
  int32_t digits = 0;  // 0: the default
  int32_t seed = -1;   // -1: a new one each time
  bool undo = false;
  bool dryRun = false;
  bool json = false;
};

int RunUndo(const RenameCommandOptions& options, const std::vector<SelectedFile>& files,
            ResultOutput& output, BatchJob& job) {
  std::set<std::string> only;
  for (const SelectedFile& file : files) only.insert(platform::AbsolutePath(file.name));
  if (UndoRename(only, options.dryRun, job)) return kExitOk;
  output.Message(
      std::string("fotomill: ") +
      WithReason(Tr("The record of the last renaming in the data folder cannot be read.")));
  return kExitFailed;
}

int RunRenameCommand(const RenameCommandOptions& options, const CommandContext& context) {
  const SelectionOptions& selection = options.selection;
  Selection chosen;
  if (!options.undo || !context.names.values.empty() || !selection.filesFrom.empty()) {
    auto selected = SelectFiles(selection, context);
    if (!selected) return kExitUsage;
    chosen = std::move(*selected);
  }
  ResultOutput output(context, options.json);
  output.CloseWith(chosen.leftOut);
  TerminalBox box(output, true, false);
  BatchJob job = NewBatchJob();
  job.box = &box;
  int status = kExitOk;
  if (options.undo) {
    status = RunUndo(options, chosen.files, output, job);
  } else {
    RenameOptions rename{.rules = SequentialRenameRulesFromSettings(), .dryRun = options.dryRun};
    if (options.digits > 0) rename.rules.digits = options.digits;
    if (options.seed >= 0) rename.seed = static_cast<uint64_t>(options.seed);
    RunRename(chosen.files, rename, job);
  }
  return std::max(status, FinishBatch(job));
}

}  // namespace

void SetUpRename(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<RenameCommandOptions>();
  AddSelection(app, options->selection, context);
  AddFlag(app, "--undo", options->undo,
          "Undo the last renaming, of all files or of the named ones");
  AddNumber(app, "--digits", options->digits, "N", 1, 10, "Digits of the numbers (default: 4)");
  AddNumber(app, "--seed", options->seed, "N", 0, INT32_MAX,
            "Seed of SequentialRenameRandom: the same seed, the same order");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be done");
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
  SetFooter(app,
            "The names follow the configuration keys that begin with SequentialRename: BaseName, BaseNumber, Increment,\n"
            "MaxAttempts, Sep, Hyphen, Prefix, Random, SkipCollide and Update.",
            "fotomill --set SequentialRenameBaseName=holiday- rename photos --dry-run");
  context.run = [options, &context] { return RunRenameCommand(*options, context); };
}

}  // namespace fotomill::cli
