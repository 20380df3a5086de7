#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <set>
#include <span>
#include <string>
#include <vector>

#include "batch/job.h"
#include "batch/run.h"
#include "files/rename_log.h"
#include "platform/files.h"

namespace fotomill {

// How files are named and numbered: the SequentialRename... keys.
struct SequentialRenameRules {
  std::string baseName = "PICTURE";
  uint32_t number = 1;  // the first
  int32_t digits = 4;
  uint32_t increment = 1;  // at least 1
  uint32_t maxAttempts = 32760;
  std::string separator = {};  // between name and number; empty: none
  bool numberFirst = false;  // the number, then the file's own old name
  bool skipColliding = false;
  bool update = true;  // the job remembers the next number
  bool random = false;
};

// The files that are renamed. In a dry run they only seem to be.
class RenamedFiles {
 public:
  // Each rename is noted in `log`, if there is one, before it is done.
  explicit RenamedFiles(bool dryRun, RenameLog* log = nullptr) : dryRun_(dryRun), log_(log) {}
  // Whether a path is taken; in a dry run, whether it would be by now.
  bool Exists(const std::string& path) const;
  // Renames without replacing anything: Taken when the new name is. A dry run only remembers it.
  platform::CommitResult Rename(const std::string& from, const std::string& to);
  bool IsDryRun() const { return dryRun_; }
  // Whether the last rename was noted.
  bool IsNoted() const { return noted_; }

 private:
  const bool dryRun_;
  RenameLog* const log_;
  bool noted_ = true;
  std::set<std::string> gone_, there_;
};

// The number as names hold it: `digits` wide, zero-filled.
std::string NumberText(uint32_t number, int32_t digits);

// Gives `path` the next free number and stores the new path in it. Ok when the file was renamed or,
// the new name being taken, left unchanged; RenameError when no number was free within the
// attempts, or when the system does not rename it. A rename sets the job's files-changed flag and
// goes to job.uses and job.changes, unless it is a dry run's; the thumbnail file follows.
Status RenameSequentially(BatchJob& job, std::string& path, const SequentialRenameRules& rules,
                          RenamedFiles& files);

// The order of a random run: places 0 to count - 1, the same for the same seed everywhere.
std::vector<size_t> RandomOrder(size_t count, uint64_t seed);

// How one run goes.
struct RenameOptions {
  SequentialRenameRules rules = {};
  std::optional<uint64_t> seed = {};  // of the random order; none: another one each time
  bool dryRun = false;
};

// Renames a selection by the rules of the options: opens the job's progress box, reports every
// file, finishes the box. What was renamed can be taken back by UndoRename until the next run.
void RunRename(std::span<const BatchFile> files, const RenameOptions& options, BatchJob& job);
// Gives the files of the last run their old names again, the last one first; with `only`, absolute
// paths, those of them only. What cannot be taken back can be tried again. When all is taken back,
// the next run counts from where the last one did. Unreadable, or locked by another program: false,
// nothing was done.
bool UndoRename(const std::set<std::string>& only, bool dryRun, BatchJob& job);

}  // namespace fotomill
