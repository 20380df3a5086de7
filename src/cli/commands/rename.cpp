#include "cli/commands/rename.h"

#include <algorithm>
#include <memory>
#include <set>
#include <string>

#include "batch/new_job.h"
#include "batch/rename/pattern_rename.h"
#include "batch/rename/sequential_rename.h"
#include "batch/rename/undo_rename.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/terminal_box.h"
#include "cli/selection/file_selection.h"
#include "core/plain_name.h"
#include "platform/folders.h"
#include "settings/configuration.h"
#include "settings/job_options.h"
#include "settings/key_table.h"
#include "settings/settings.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct RenameCommandOptions {
  SelectionOptions selection;
  std::string pattern;    // empty: rename in sequence
  std::string base;       // empty: use settings
  int32_t start = -1;     // -1: use the default
  int32_t digits = 0;     // 0: use the default
  int32_t increment = 0;  // 0: use settings
  int32_t seed = -1;   // -1: a random one
  bool undo = false;
  bool dryRun = false;
  bool json = false;
};

int RunUndo(const RenameCommandOptions& options, const std::vector<SelectedFile>& files,
            ResultOutput& output, BatchJob& job) {
  std::set<std::string> only;
  for (const SelectedFile& file : files) only.insert(platform::AbsolutePath(file.name));
  if (UndoRename(only, options.dryRun, job, CommentExtensionBesideFromSettings()))
    return kExitOk;
  output.Message(
      std::string("fotomill: ") +
      WithReason(Tr("The record of the last renaming, in the data folder, cannot be read.")));
  return kExitFailed;
}

// The rules from the settings, overridden by the options. A series given on the command line has
// its own numbers and does not change the configured one.
SequentialRenameRules RulesOf(const RenameCommandOptions& options) {
  SequentialRenameRules rules = SequentialRenameRulesFromSettings();
  if (!options.base.empty()) {
    rules.baseName = options.base;
    rules.numberFirst = false;  // without base name
  }
  if (!options.base.empty() || options.start >= 0) {
    rules.update = false;
    if (!IsForThisRun(KeyOf(KeyNumber::SequentialRenameBaseNumber))) rules.number = 1;
    if (options.start >= 0) rules.number = static_cast<uint32_t>(options.start);
  }
  if (options.digits > 0) rules.digits = options.digits;
  if (options.increment > 0) rules.increment = static_cast<uint32_t>(options.increment);
  return rules;
}

PatternRenameOptions PatternOf(const RenameCommandOptions& options) {
  return {.pattern = options.pattern,
          .start = std::max(options.start, options.start < 0 ? 1 : 0),
          .increment = std::max(options.increment, 1),
          .copyrightHolder = std::string(settings.ExifCopyrightHolder),
          .commentExtension = CommentExtensionBesideFromSettings(),
          .dryRun = options.dryRun};
}

int RunRenameCommand(const RenameCommandOptions& options, const CommandContext& context) {
  if (!IsPlainName(options.base))
    return UsageError(context, Tr("The base name must be part of a file name, not a path."));
  if (!options.pattern.empty()) {
    const RecordedText problem = PatternProblem(options.pattern);
    if (!problem.empty()) {
      std::string message = Tr("The pattern \"%1\" %2", options.pattern, problem.shown);
      if (!message.ends_with('.') && !message.ends_with('?')) message += '.';
      return UsageError(context, message);
    }
  }
  const SelectionOptions& selection = options.selection;
  Selection chosen;
  const bool named = !context.names.values.empty() || !selection.filesFrom.empty();
  if (!options.undo || named) {
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
    // without names, all files
    if (!named || !chosen.files.empty()) status = RunUndo(options, chosen.files, output, job);
  } else if (!options.pattern.empty()) {
    RunPatternRename(chosen.files, PatternOf(options), job);
  } else {
    RenameOptions rename{.rules = RulesOf(options),
                         .commentExtension = CommentExtensionBesideFromSettings(),
                         .dryRun = options.dryRun};
    if (options.seed >= 0) rename.seed = static_cast<uint64_t>(options.seed);
    RunRename(chosen.files, rename, job);
  }
  return std::max(status, FinishBatch(job, context));
}

}  // namespace

void SetUpRename(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<RenameCommandOptions>();
  AddSelection(app, options->selection, context);
  CLI::Option* undo = AddFlag(app, "--undo", options->undo,
                              "Undo the last renaming, of all files or of the named ones");
  CLI::Option* pattern =
      AddName(app, "--pattern", options->pattern, "TEXT",
              "New names, without extension, as a text with macros: %F, %D, %03c, ...");
  Exclude(pattern, undo);
  CLI::Option* base = AddName(app, "--base", options->base, "NAME",
                              "Base name (default: SequentialRenameBaseName); counts from --start");
  Exclude(
      AddNumber(
          app, "--start", options->start, "N", 0, INT32_MAX,
          "First number (default with --base or --pattern: 1); the configured one is not changed"),
      undo);
  Exclude(AddNumber(app, "--increment", options->increment, "N", 1, INT32_MAX,
                    "Step between numbers (default: SequentialRenameIncrement; with --pattern: 1)"),
          undo);
  CLI::Option* digits =
      AddNumber(app, "--digits", options->digits, "N", 1, 10, "Digits of the numbers (default: 4)");
  CLI::Option* seed = AddNumber(app, "--seed", options->seed, "N", 0, INT32_MAX,
                                "Seed of SequentialRenameRandom: the same seed, the same order");
  for (CLI::Option* option : {base, digits, seed}) {
    Exclude(option, undo);
    Exclude(option, pattern);
  }
  AddDryRunAndJson(app, options->dryRun, options->json,
                   "Print a JSON array of {file, destination, status, message}");
  SetFooter(app,
            "The names follow the configuration keys that begin with SequentialRename: BaseName, "
            "BaseNumber, Increment,\n"
            "MaxAttempts, Sep, Hyphen, Prefix, Random, SkipCollide and Update. Without --base and "
            "--start, each run counts on from\n"
            "the last one unless SequentialRenameUpdate is off.\n"
            "A pattern has the macros of captions (fotomill help names), %D{...} for the date in "
            "another form, and %c for a\n"
            "counter. Extensions are kept, existing files are never replaced, and files may "
            "exchange names.",
            "fotomill rename photos --pattern '%D{%Y-%m-%d} %03c %F' --sort taken --dry-run");
  context.run = [options, &context] { return RunRenameCommand(*options, context); };
}

}  // namespace fotomill::cli
