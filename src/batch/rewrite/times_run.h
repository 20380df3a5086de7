#pragma once

#include <functional>
#include <span>
#include <string>

#include "batch/batch_file.h"
#include "batch/job.h"
#include "files/file_time_change.h"
#include "metadata/tags/picture_tags.h"

namespace fotomill {

// How to set the times of files.
struct TimesFunction {
  FileTimeRule rule;
  TagSources sources = {};  // where to find out when a picture was taken, if the rule says so
  bool dryRun = false;
  // Called for each file of the run in order; on any thread, but never two at a time.
  std::function<void(const std::string& path, const FileTimeChange& change)> changed = {};
};

// Sets the times of a selection: opens the job's progress box, reports every file in selection
// order with its old and new time, closes the box. Ok, or FunctionCancelled if the box cannot be
// shown.
Status RunFileTimes(std::span<const BatchFile> files, const TimesFunction& function, BatchJob& job);

}  // namespace fotomill
