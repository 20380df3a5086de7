#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <set>
#include <span>
#include <string>
#include <vector>

#include "batch/batch_file.h"
#include "batch/job.h"
#include "batch/rename/renamed_files.h"

namespace fotomill {

// Rules for naming and numbering files: the SequentialRename... keys.
struct SequentialRenameRules {
  std::string baseName = "PICTURE";
  uint32_t number = 1;  // first number
  int32_t digits = 4;
  uint32_t increment = 1;  // at least 1
  uint32_t maxAttempts = 32760;
  std::string separator = {};  // between name and number; may be empty
  bool numberFirst = false;    // number before the file's own name
  bool skipColliding = false;
  bool update = true;  // save the next number in the job
  bool random = false;
};

// Formats a number with `digits` digits, zero-padded.
std::string NumberText(uint32_t number, int32_t digits);

// Renames `path` to the next free number and updates it. Ok if renamed, or if left unchanged
// because the new name is taken; RenameError if no number was free within the attempts, or the
// system refuses. A rename sets the job's files-changed flag and is added to job.uses and
// job.changes, except in a dry run; the thumbnail file is renamed along.
Status RenameSequentially(BatchJob& job, std::string& path, const SequentialRenameRules& rules,
                          RenamedFiles& files);

// A random permutation of 0 to count - 1, the same for the same seed on every system.
std::vector<size_t> RandomOrder(size_t count, uint64_t seed);

// Options for a run.
struct RenameOptions {
  SequentialRenameRules rules = {};
  std::optional<uint64_t> seed = {};  // for random order; none: different each time
  std::string commentExtension = {};  // of comment files that go along; empty: none
  bool dryRun = false;
};

// Renames a selection: opens the job's progress box, reports every file, closes the box. UndoRename
// can undo it until the next run.
void RunRename(std::span<const BatchFile> files, const RenameOptions& options, BatchJob& job);

}  // namespace fotomill
