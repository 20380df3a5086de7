#pragma once

#include <set>
#include <span>
#include <string>
#include <utility>
#include <vector>

#include "batch/batch_file.h"
#include "batch/job.h"
#include "files/rename_log.h"
#include "platform/output_file.h"
#include "texts/texts.h"

namespace fotomill {

// Renames files, or pretends to in a dry run.
class RenamedFiles {
 public:
  // Renames are recorded in `log`, if not null, before they are done.
  // `commentExtension`: of the text files with comments beside pictures; empty: there are none.
  explicit RenamedFiles(bool dryRun, RenameLog* log = nullptr, std::string commentExtension = {})
      : dryRun_(dryRun), log_(log), commentExtension_(std::move(commentExtension)) {}
  // Whether a path exists, or would exist by now in a dry run.
  bool Exists(const std::string& path) const;
  // Renames without replacing: returns Taken if the new name exists. A dry run only records it. The
  // sidecars and the comment file of a picture go along, or nothing is renamed.
  platform::CommitResult Rename(const std::string& from, const std::string& to);
  // After a failure: the new name that was not available, of the file or of a sidecar.
  const std::string& RefusedName() const { return refused_; }
  // Whether a file, given by its absolute path, was renamed as the sidecar of another.
  bool WentAlong(const std::string& path) const;
  bool IsDryRun() const { return dryRun_; }
  // Whether the last rename was logged.
  bool IsNoted() const { return noted_; }

 private:
  platform::CommitResult Refused(const std::string& name, platform::CommitResult result);
  platform::CommitResult RenameTogether(const std::string& from, const std::string& to,
                                        std::span<const RenamedFile> sidecars);
  platform::CommitResult Pretend(const std::string& from, const std::string& to,
                                 std::span<const RenamedFile> sidecars);

  const bool dryRun_;
  RenameLog* const log_;
  const std::string commentExtension_;
  bool noted_ = true;
  std::string refused_;
  std::set<std::string> gone_, there_, sidecars_;
};

// The remark about a file that was renamed but cannot be undone.
inline constexpr const char* kRenameNotNoted = TrLater("It could not be recorded for --undo.");

// The names "photo.nef.xmp" and "photo.nef.txt", of comment files, for all files of a list, as
// absolute paths. Such a file in the same list is renamed with its picture only.
std::set<std::string> SidecarsOfListed(std::span<const BatchFile> files,
                                       const std::string& commentExtension);

// The remark about such a file.
inline constexpr const char* kRenamedWithPicture =
    TrLater("skipped: it was renamed with its picture.");

// Records a completed rename in the job and renames the thumbnail file, except in a dry run.
void NoteRename(const std::string& from, const std::string& to, bool dryRun, BatchJob& job);

// The result of one of several renames.
struct RenameAttempt {
  bool reached = false;  // false: the job was stopped before
  bool done = false;
  bool noted = true;        // it can be undone
  std::string reason = {};  // if it failed, a sentence
};

// Renames files whose new names may be old names of others; absolute paths, old ones different. No
// existing file is replaced. Completed renames are recorded in the job. In the order of the list.
std::vector<RenameAttempt> CarryOutRenames(std::span<const RenamedFile> wanted, RenamedFiles& files,
                                           BatchJob& job);

}  // namespace fotomill
