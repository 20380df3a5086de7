#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>

#include "batch/rewrite/rewrite_file.h"
#include "batch/run.h"

namespace fotomill {

// What is done to every file of a selection that is rewritten in its own format.
struct RewriteFunction {
  // Rewrites one file, or says why not; on any thread.
  std::function<RewrittenFile(const std::string& source, const std::string& destination,
                              const RewriteRequest& request, const WriteOptions& options)>
      rewrite;
  // Why a file is left out that is so already, or is named twice.
  const char* unchanged = "";
  const char* listedTwice = "";
  FileFunction history = FileFunction::Transform;  // under which the files go into the file history
  // each file is replaced; otherwise it is written to the job's destination folder under its own
  // name
  bool inPlace = false;
  std::string out = {};   // not empty: the whole path of the output of a selection of one
  bool keepTree = false;  // the folders of the selection are recreated there
  bool keepTimes = false;
  bool dryRun = false;
  uint32_t jobs = 0;  // number of parallel jobs; 0: one per core
  // Called on any thread before a file is replaced in place; false: it is left alone, because no
  // copy could be kept.
  std::function<bool(const std::string& path)> keepPrevious = {};
  // called likewise as soon as that was done
  std::function<void(const std::string& path)> replaced = {};
};

// Rewrites a selection: opens the job's progress box, reports every file in selection order,
// finishes the box. Ok, or FunctionCancelled when the box cannot be shown.
Status RunRewrite(std::span<const BatchFile> files, const RewriteFunction& function, BatchJob& job);

}  // namespace fotomill
