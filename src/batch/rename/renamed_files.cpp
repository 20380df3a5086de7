#include "batch/rename/renamed_files.h"

#include "files/numbered_name.h"
#include "files/rename_plan.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Free names for the detours of a plan, each given once.
class SpareNames {
 public:
  SpareNames(std::span<const RenamedFile> wanted, const RenamedFiles& files) : files_(files) {
    for (const RenamedFile& file : wanted) reserved_.insert(file.to);
  }
  std::string Take(const std::string& path) {
    std::string spare = path;
    (void)MakeNumberedVariant(spare, 1, kMostVariants, [this](const std::string& name) {
      return files_.Exists(name) || reserved_.contains(name) ? platform::Existence::Yes
                                                             : platform::Existence::No;
    });
    reserved_.insert(spare);
    return spare;
  }

 private:
  const RenamedFiles& files_;
  std::set<std::string> reserved_;
};

// Renames the files of a group. If a step fails, goes back to the state before the group.
RenameAttempt CarryOutGroup(const RenameGroup& group, RenamedFiles& files, BatchJob& job) {
  RenameAttempt attempt{.reached = true};
  size_t done = 0;
  for (const RenameStep& step : group) {
    const platform::CommitResult result = files.Rename(step.from, step.to);
    if (result == platform::CommitResult::Taken) {
      attempt.reason = Tr("\"%1\" exists.", platform::FileNameOf(step.to));
    } else if (result == platform::CommitResult::Failed) {
      attempt.reason = ReasonSentence();
    }
    if (result != platform::CommitResult::Done) break;
    attempt.noted = attempt.noted && files.IsNoted();
    NoteRename(step.from, step.to, files.IsDryRun(), job);
    ++done;
  }
  attempt.done = done == group.size();
  for (; !attempt.done && done > 0; --done) {
    const RenameStep& step = group[done - 1];
    if (files.Rename(step.to, step.from) == platform::CommitResult::Done)
      NoteRename(step.to, step.from, files.IsDryRun(), job);
  }
  return attempt;
}

}  // namespace

bool RenamedFiles::Exists(const std::string& path) const {
  if (there_.contains(path)) return true;
  return !gone_.contains(path) && platform::FileExists(path);
}

platform::CommitResult RenamedFiles::Rename(const std::string& from, const std::string& to) {
  if (!dryRun_) {
    noted_ =
        log_ == nullptr || log_->Intend({platform::AbsolutePath(from), platform::AbsolutePath(to)});
    const platform::CommitResult result =
        platform::RenameFile(from, to, platform::Existing::Refuse);
    if (log_ != nullptr) log_->Settle(result == platform::CommitResult::Done);
    return result;
  }
  if (Exists(to)) return platform::CommitResult::Taken;
  if (!platform::MayCreate(to)) return platform::CommitResult::Failed;
  there_.erase(from);
  gone_.insert(from);
  gone_.erase(to);
  there_.insert(to);
  return platform::CommitResult::Done;
}

void NoteRename(const std::string& from, const std::string& to, bool dryRun, BatchJob& job) {
  job.filesChanged = true;
  if (dryRun) return;
  const std::string old = platform::AbsolutePath(from), now = platform::AbsolutePath(to);
  job.uses.push_back({.path = now,
                      .function = FileFunction::MoveAndCopy,
                      .accessed = static_cast<int32_t>(platform::Now()),
                      .from = old});
  job.changes.push_back({old, now});
  FollowThumbnailFile(old, now);
}

std::vector<RenameAttempt> CarryOutRenames(std::span<const RenamedFile> wanted, RenamedFiles& files,
                                           BatchJob& job) {
  SpareNames spares(wanted, files);
  const std::vector<RenameGroup> plan =
      PlanRenames(wanted, [&spares](const std::string& path) { return spares.Take(path); });
  std::vector<RenameAttempt> attempts(wanted.size());
  const StopToken stop = job.stop.Token();
  for (const RenameGroup& group : plan) {
    if (stop.Asked()) break;
    const RenameAttempt attempt = CarryOutGroup(group, files, job);
    for (const RenameStep& step : group) attempts[step.index] = attempt;
  }
  return attempts;
}

}  // namespace fotomill
