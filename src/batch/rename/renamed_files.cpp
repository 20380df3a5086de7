#include "batch/rename/renamed_files.h"

#include "core/text.h"
#include "files/numbered_name.h"
#include "files/rename_plan.h"
#include "files/sidecar_moves.h"
#include "metadata/tags/sidecar.h"
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
      attempt.reason = Tr("\"%1\" exists.", platform::FileNameOf(files.RefusedName()));
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
  const std::vector<RenamedFile> sidecars = SidecarMoves(from, to, commentExtension_);
  for (const RenamedFile& sidecar : sidecars) {
    // nor is a sidecar given to another picture
    const bool same = EqualIgnoringCase(sidecar.from, sidecar.to);  // maybe, for the system
    if (!same && Exists(sidecar.to)) return Refused(sidecar.to, platform::CommitResult::Taken);
  }
  if (!dryRun_) {
    noted_ =
        log_ == nullptr || log_->Intend({platform::AbsolutePath(from), platform::AbsolutePath(to)});
  }
  const platform::CommitResult result =
      dryRun_ ? Pretend(from, to, sidecars) : RenameTogether(from, to, sidecars);
  const bool done = result == platform::CommitResult::Done;
  if (!dryRun_ && log_ != nullptr) log_->Settle(done);
  for (const RenamedFile& sidecar : sidecars) {
    if (done) sidecars_.insert(platform::AbsolutePath(sidecar.from));
  }
  return result;
}

platform::CommitResult RenamedFiles::Refused(const std::string& name,
                                             platform::CommitResult result) {
  refused_ = name;
  return result;
}

// The picture first: if the program is ended before the sidecars follow, undo restores the pair.
platform::CommitResult RenamedFiles::RenameTogether(const std::string& from, const std::string& to,
                                                    std::span<const RenamedFile> sidecars) {
  constexpr auto kRefuse = platform::Existing::Refuse;
  constexpr auto kDone = platform::CommitResult::Done;
  platform::CommitResult result = platform::RenameFile(from, to, kRefuse);
  if (result != kDone) return Refused(to, result);
  size_t done = 0;
  while (done < sidecars.size() && result == kDone) {
    result = platform::RenameFile(sidecars[done].from, sidecars[done].to, kRefuse);
    if (result == kDone) ++done;
  }
  if (result == kDone) return result;
  Refused(sidecars[done].to, result);
  while (done > 0) {
    --done;
    (void)platform::RenameFile(sidecars[done].to, sidecars[done].from, kRefuse);
  }
  (void)platform::RenameFile(to, from, kRefuse);
  return result;
}

platform::CommitResult RenamedFiles::Pretend(const std::string& from, const std::string& to,
                                             std::span<const RenamedFile> sidecars) {
  if (Exists(to)) return Refused(to, platform::CommitResult::Taken);
  if (!platform::MayCreate(to)) return Refused(to, platform::CommitResult::Failed);
  const auto move = [this](const std::string& old, const std::string& now) {
    there_.erase(old);
    gone_.insert(old);
    gone_.erase(now);
    there_.insert(now);
  };
  move(from, to);
  for (const RenamedFile& sidecar : sidecars) move(sidecar.from, sidecar.to);
  return platform::CommitResult::Done;
}

bool RenamedFiles::WentAlong(const std::string& path) const {
  return sidecars_.contains(path) && !Exists(path);
}

std::set<std::string> SidecarsOfListed(std::span<const BatchFile> files,
                                       const std::string& commentExtension) {
  std::set<std::string> sidecars;
  for (const BatchFile& file : files) {
    const std::string path = platform::AbsolutePath(file.name);
    sidecars.insert(SidecarNames(path).front());
    if (!commentExtension.empty()) sidecars.insert(CommentFileName(path, {}, commentExtension));
  }
  return sidecars;
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
