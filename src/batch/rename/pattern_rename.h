#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "batch/batch_file.h"
#include "batch/job.h"

namespace fotomill {

// How to rename files by a pattern.
struct PatternRenameOptions {
  // The new names without extension: text with macros, and "%c" or "%03c" for a counter. Checked
  // with PatternProblem.
  std::string pattern;
  int64_t start = 1, increment = 1;  // of the counter
  std::string copyrightHolder = {};  // for %N; empty: use the user's full name
  std::string commentExtension = {};  // of comment files that go along; empty: none
  bool dryRun = false;
};

// What is wrong with a pattern, as the end of a sentence: "has an unknown macro %Q". Empty if it is
// valid.
RecordedText PatternProblem(std::string_view pattern);

// Renames a selection within its folders: opens the job's progress box, reports every file in
// order, closes the box. Extensions are kept. Files may exchange names; a name that another file
// has is never taken. UndoRename can undo it until the next run.
void RunPatternRename(std::span<const BatchFile> files, const PatternRenameOptions& options,
                      BatchJob& job);

}  // namespace fotomill
