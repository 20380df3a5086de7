#pragma once

#include <string>
#include <vector>

#include "batch/job.h"
#include "batch/rewrite/rewrite_run.h"
#include "cli/frame/command.h"
#include "cli/selection/file_selection.h"

namespace fotomill::cli {

// Destination and output options of commands that rewrite files in their own format.
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

// Declares the options: --in-place, --dest or --out, and related ones.
void AddRewriteOptions(CLI::App& app, RewriteOptions& options);

// The function for these options; the command sets `rewrite` and the texts.
RewriteFunction RewriteFunctionOf(const RewriteOptions& options);

// Checks the options and selects files. nullopt,
// after printing a message, for a usage error.
std::optional<Selection> SelectForRewrite(RewriteOptions& options, const CommandContext& context);

// Runs `start`, which starts a batch for the selection, with a job set up from the options; returns
// the exit status.
int RunRewriteJob(const RewriteOptions& options, const Selection& selection,
                  const CommandContext& context, const std::function<void(BatchJob& job)>& start);

}  // namespace fotomill::cli
