#include "batch/rename/undo_rename.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "batch/progress_box.h"
#include "batch/rename/renamed_files.h"
#include "files/rename_log.h"
#include "files/rename_plan.h"
#include "platform/files.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// The files to restore, the last one first, from their present names.
std::vector<RenamedFile> Wanted(const std::vector<RenamedFile>& renames,
                                const std::set<std::string>& only) {
  std::vector<RenamedFile> wanted;
  for (auto file = renames.rbegin(); file != renames.rend(); ++file) {
    if (only.empty() || only.contains(file->to)) wanted.push_back({file->to, file->from});
  }
  return wanted;
}

// Restores files and reports them. Returns the present names of those that were restored.
std::set<std::string> Restore(const std::vector<RenamedFile>& wanted, RenamedFiles& files,
                              BatchJob& job) {
  std::vector<RenamedFile> there;
  for (const RenamedFile& file : wanted) {
    if (files.Exists(file.from)) there.push_back(file);
  }
  const std::vector<RenameAttempt> attempts = CarryOutRenames(there, files, job);
  std::set<std::string> restored;
  uint32_t done = 0;
  for (size_t i = 0, next = 0; i < wanted.size(); ++i) {
    const RenamedFile& file = wanted[i];
    FileOutcome outcome{.source = file.from, .destination = file.to};
    if (next == there.size() || there[next].from != file.from) {
      outcome.status = Status::FileOpenError;
      outcome.hint = Tr("The file does not exist.");
    } else {
      const RenameAttempt& attempt = attempts[next++];
      if (!attempt.reached) continue;
      if (attempt.done) restored.insert(file.from);
      if (!attempt.done) outcome.status = Status::RenameError;
      outcome.hint = attempt.reason;
    }
    ReportOutcome(job, outcome, done++, static_cast<uint32_t>(wanted.size()));
  }
  return restored;
}

}  // namespace

bool UndoRename(const std::set<std::string>& only, bool dryRun, BatchJob& job,
                const std::string& commentExtension) {
  RenameLog lock;
  if (!dryRun && !lock.LockForUndo()) return false;
  const auto log = ReadRenameLog();
  if (!log) return false;
  RenameHistory remaining{.files = RenamesToUndo(log->files, platform::FileExists),
                          .number = log->number};
  if (!OpenProgressBox(job)) return true;
  RenamedFiles files(dryRun, dryRun ? nullptr : &lock, commentExtension);
  const std::set<std::string> restored = Restore(Wanted(remaining.files, only), files, job);
  std::erase_if(remaining.files,
                [&](const RenamedFile& file) { return restored.contains(file.to); });
  MarkChangedRecords(std::exchange(job.changes, {}));
  if (!dryRun && !log->files.empty() && !WriteRenameLog(remaining)) {
    job.errors = true;
  }
  if (!dryRun && remaining.files.empty() && log->number && job.remember) {
    job.remember(Remembered::NextRenameNumber,
                 static_cast<int32_t>(std::min<uint32_t>(*log->number, INT32_MAX)));
  }
  FinishProgress(job);
  return true;
}

}  // namespace fotomill
