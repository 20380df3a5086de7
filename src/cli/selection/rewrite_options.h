#pragma once

#include <string>
#include <vector>

#include "batch/job.h"
#include "batch/rewrite/rewrite_run.h"
#include "cli/frame/command.h"
#include "cli/selection/file_selection.h"

namespace fotomill::cli {

// Where files go that a command rewrites in their own format, and what is shown.
struct RewriteOptions {
  SelectionOptions selection;
  std::string dest, out;
  std::string overwrite = "keep-both";
  int32_t jobs = 0;
  bool inPlace = false;
  bool keepTree = false;
  bool keepTimes = false;
  bool dryRun = false;
  bool json = false;
};

// Declares the options: one of --in-place, --dest and --out, and what goes with them.
void AddRewriteOptions(CLI::App& app, RewriteOptions& options);

// The function that the options ask for; its `rewrite` and texts are the command's.
RewriteFunction RewriteFunctionOf(const RewriteOptions& options);

// The files of the command line, after a check of the options. nullopt, after a message, for a
// usage error.
std::optional<Selection> SelectForRewrite(RewriteOptions& options, const CommandContext& context);

// Runs `start`, which begins a batch over the selection, with a job that goes where the options say;
// the command's exit status.
int RunRewriteJob(const RewriteOptions& options, const Selection& selection,
                  const CommandContext& context, const std::function<void(BatchJob& job)>& start);

}  // namespace fotomill::cli
