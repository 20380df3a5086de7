#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "batch/rewrite/rewrite_file.h"
#include "batch/batch_file.h"
#include "batch/job.h"

namespace fotomill {

// How to process the files of a selection that are rewritten in their own format.
struct RewriteFunction {
  // Rewrites one file, or returns why not; on any thread.
  std::function<RewrittenFile(const std::string& source, const std::string& destination,
                              const RewriteRequest& request, const WriteOptions& options)>
      rewrite;
  // Texts for skipped files: no change needed; listed twice.
  const char* unchanged = "";
  const char* listedTwice = "";
  FileFunction history = FileFunction::Transform;  // function recorded in the file history
  // replace each file; otherwise write it to the
  // job's destination folder under the same name
  bool inPlace = false;
  std::string out = {};   // not empty: the full output path for a selection of one file
  bool keepTree = false;  // recreate the folders of the selection there
  bool keepTimes = false;
  bool dryRun = false;
  uint32_t jobs = 0;  // number of parallel jobs; 0: one per core
  // Called on any thread before a file is replaced in place; return false to leave it unchanged, if
  // no copy could be kept.
  std::function<bool(const std::string& path)> keepPrevious = {};
  // called right after replacing it
  std::function<void(const std::string& path)> replaced = {};
};

// Rewrites a selection: opens the job's progress box, reports every file in selection order, closes
// the box. Ok, or FunctionCancelled if the box cannot be shown.
Status RunRewrite(std::span<const BatchFile> files, const RewriteFunction& function, BatchJob& job);

}  // namespace fotomill
