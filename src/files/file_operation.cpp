#include "files/file_operation.h"

#include <algorithm>
#include <set>

#include "catalog/thumbnails/picture_changes.h"
#include "core/text.h"
#include "files/file_time_change.h"
#include "files/numbered_name.h"
#include "files/previous_file.h"
#include "files/sidecar_moves.h"
#include "platform/clock.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "platform/reason.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr const char* kTaken = TrLater("A file of that name already exists.");
constexpr const char* kGone = TrLater("It no longer exists.");
constexpr const char* kChanged = TrLater("It was changed since, so it was left alone.");
constexpr const char* kCopyChanged = TrLater("The copy was changed since, so it was left alone.");
constexpr const char* kNotWritten = TrLater("The copy could not be written; the disk may be full.");
constexpr const char* kTooDeep = TrLater("The folders are nested too deeply.");
constexpr int kDeepest = 64;  // of nested folders

// The reason for a failure; empty on success.
using Outcome = std::string;

Outcome CopyFile(const std::string& from, const std::string& to, platform::Existing existing) {
  constexpr size_t kPart = 4 * 1024 * 1024;
  platform::FileView view;
  platform::OutputFile output;
  if (!view.Open(from)) return WithReason(Tr("It cannot be read."));
  if (!output.Create(to)) return WithReason(Tr("The folder cannot be written to."));
  const auto bytes = view.Bytes();
  for (size_t at = 0; at < bytes.size(); at += kPart) {
    if (!output.Write(bytes.subspan(at, std::min(kPart, bytes.size() - at))))
      return WithReason(Tr(kNotWritten));
  }
  if (!view.Intact()) return Tr("It was truncated while it was copied.");
  const platform::CommitResult result = output.Commit(existing);
  if (result == platform::CommitResult::Taken) return Tr(kTaken);
  if (result != platform::CommitResult::Done) return WithReason(Tr(kNotWritten));
  (void)platform::CopyTimes(from, to);
  return {};
}

Outcome CopyTree(const std::string& from, const std::string& to, int depth) {
  if (!platform::IsFolder(from)) return CopyFile(from, to, platform::Existing::Refuse);
  if (depth > kDeepest) return Tr(kTooDeep);
  if (to.starts_with(platform::JoinFolder(from, "")))
    return Tr("A folder cannot be copied into itself.");
  if (platform::ExistenceOf(to) == platform::Existence::Yes) return Tr(kTaken);
  const auto entries = platform::ListFolder(from);
  if (!entries) return WithReason(Tr("The folder cannot be read."));
  if (!platform::MakeFolders(to)) return WithReason(Tr("The folder cannot be created."));
  for (const platform::FolderEntry& entry : *entries) {
    Outcome outcome = entry.link ? Outcome(Tr("It contains a link, which is not copied."))
                                 : CopyTree(platform::JoinFolder(from, entry.name),
                                            platform::JoinFolder(to, entry.name), depth + 1);
    if (!outcome.empty()) return outcome;
  }
  return {};
}

Outcome DeleteTree(const std::string& path, int depth) {
  if (!platform::IsFolder(path) || platform::FactsOf(path).link) {
    return platform::DeleteFile(path) ? Outcome()
                                      : Outcome(WithReason(Tr("It could not be deleted.")));
  }
  if (depth > kDeepest) return Tr(kTooDeep);
  for (const platform::FolderEntry& entry :
       platform::ListFolder(path).value_or(std::vector<platform::FolderEntry>())) {
    Outcome outcome = DeleteTree(platform::JoinFolder(path, entry.name), depth + 1);
    if (!outcome.empty()) return outcome;
  }
  return platform::DeleteFolder(path) ? Outcome() : Outcome(Tr("The folder could not be deleted."));
}

bool SameVolume(const std::string& a, const std::string& b) {
  return platform::FactsOf(a).device == platform::FactsOf(platform::FolderOf(b)).device;
}

Outcome MoveOne(const std::string& from, const std::string& to) {
  if (!platform::FileExists(from)) return Tr(kGone);
  const platform::Existence existence = platform::ExistenceOf(to);
  if (existence == platform::Existence::Unknown) return WithReason(Tr("It could not be renamed."));
  if (existence == platform::Existence::Yes && from != to) {
    const platform::FileFacts a = platform::FactsOf(from), b = platform::FactsOf(to);
    // a name that differs only in case
    const bool same = a.identity == b.identity && a.device == b.device;
    if (!same) return Tr(kTaken);
  }
  if (to.starts_with(platform::JoinFolder(from, "")))
    return Tr("A folder cannot be moved into itself.");
  const platform::CommitResult result = platform::RenameFile(from, to, platform::Existing::Refuse);
  if (result == platform::CommitResult::Done) return {};
  if (result == platform::CommitResult::Taken) return Tr(kTaken);
  if (SameVolume(from, to)) return WithReason(Tr("It could not be renamed."));
  // Across volumes a move is copy and delete; a partial copy is deleted if copying fails. Files are
  // copied as a whole or not at all: one that is there then is another's.
  Outcome outcome = CopyTree(from, to, 0);
  if (!outcome.empty()) {
    if (outcome != Tr(kTaken) && platform::IsFolder(from)) (void)DeleteTree(to, 0);
    return outcome;
  }
  return DeleteTree(from, 0);
}

Outcome TrashOne(const std::string& path) {
  if (!platform::FileExists(path)) return Tr(kGone);
  if (platform::MoveToTrash(path)) return {};
  return platform::SystemReason().empty()
             ? Tr("There is no trash on this volume; Shift+Delete deletes permanently.")
             : WithReason(Tr("It could not be moved to the trash."));
}

// Whether a file may be trashed or deleted.
Outcome CheckSeen(const FileStep& step) {
  if (!step.seen.there || platform::StampOf(step.from) == step.seen) return {};
  return platform::FileExists(step.from) ? Tr(kChanged) : Tr(kGone);
}

Outcome Restore(const std::string& path) {
  if (platform::FileExists(path)) return Tr(kTaken);
  return platform::RestoreFromTrash(path) ? Outcome()
                                          : Outcome(Tr("It is no longer in the trash."));
}

// Restores the previous contents and keeps the current ones in their place.
Outcome Exchange(const FileStep& step) {
  const bool there = platform::FileExists(step.from);
  if (step.previous->HasChanged(step.from)) return there ? Tr(kChanged) : Tr(kGone);
  PreviousFile now;
  if (!now.Keep(step.from)) return Tr("There is not enough disk space to keep the current file.");
  DeleteThumbnailFile(step.from);  // it may be newer than the restored file
  if (step.previous->Path().empty()) {
    if (!platform::DeleteFile(step.from)) return WithReason(Tr("It could not be deleted."));
  } else {
    Outcome outcome = CopyFile(step.previous->Path(), step.from,
                               there ? platform::Existing::Replace : platform::Existing::Refuse);
    if (!outcome.empty()) return outcome;
  }
  step.previous->PutBack(step.from, now);
  return {};
}

// Sets times, unless the file has changed since it got those of `now`.
Outcome SetTimes(const std::string& path, const platform::FileTimes& now,
                 const platform::FileTimes& wanted) {
  const FileTimeChange change = UndoTimes({path, wanted, now}, false);
  if (change.status == Status::Ok) return {};
  return change.status == Status::FileOpenError ? Tr(kGone) : change.hint;
}

Outcome DoStep(FileOperationKind kind, const FileStep& step) {
  switch (kind) {
    case FileOperationKind::Rename:
    case FileOperationKind::Move: return MoveOne(step.from, step.to);
    case FileOperationKind::Copy: return CopyTree(step.from, step.to, 0);
    case FileOperationKind::Create: return Restore(step.to);
    case FileOperationKind::Turn:
    case FileOperationKind::Tag:
    case FileOperationKind::Change: return Exchange(step);
    case FileOperationKind::Times: return SetTimes(step.from, step.oldTimes, step.newTimes);
    case FileOperationKind::Trash: break;
  }
  return TrashOne(step.from);
}

bool IsGone(const std::string& path) {
  return platform::FactsOf(path).kind == platform::FileKind::Missing;
}

// Trashes a copy, unless it or a sidecar that went along was edited since.
Outcome RemoveCopy(const FileStep& step) {
  if (IsGone(step.to)) return Tr(kGone);
  if (step.made.there && platform::StampOf(step.to) != step.made) return Tr(kCopyChanged);
  for (const FileAlong& one : step.along) {
    if (!IsGone(one.path) && platform::StampOf(one.path) != one.made) return Tr(kCopyChanged);
  }
  return TrashOne(step.to);
}

void NoteCopy(FileStep& step) {
  if (platform::IsRegularFile(step.to)) step.made = platform::StampOf(step.to);
}

Outcome UndoStep(FileOperationKind kind, const FileStep& step) {
  switch (kind) {
    case FileOperationKind::Rename:
    case FileOperationKind::Move: return MoveOne(step.to, step.from);
    case FileOperationKind::Copy: return RemoveCopy(step);
    case FileOperationKind::Create: return TrashOne(step.to);
    case FileOperationKind::Turn:
    case FileOperationKind::Tag:
    case FileOperationKind::Change: return Exchange(step);
    case FileOperationKind::Times: return SetTimes(step.from, step.newTimes, step.oldTimes);
    case FileOperationKind::Trash: break;
  }
  return Restore(step.from);
}

// What a run of steps did besides: places where sidecars went or left, so that a step for them is
// settled; and those that stayed behind.
struct AlongTheWay {
  std::set<std::string> settled;
  std::vector<FileOperationFailure> failures;
};

// The sidecars and comment files that go along when a file is renamed, moved or copied.
std::vector<RenamedFile> SidecarsAlong(const FileOperation& operation, const std::string& from,
                                       const std::string& to) {
  const bool copy = operation.kind == FileOperationKind::Copy;
  const bool goes = copy || operation.kind == FileOperationKind::Rename ||
                    operation.kind == FileOperationKind::Move;
  return goes && platform::IsRegularFile(from)
             ? SidecarMoves(from, to, operation.commentExtension, copy)
             : std::vector<RenamedFile>();
}

bool AnyTaken(const std::vector<RenamedFile>& sidecars) {
  return std::ranges::any_of(sidecars, [](const RenamedFile& sidecar) {
    return !EqualIgnoringCase(sidecar.from, sidecar.to) &&
           platform::ExistenceOf(sidecar.to) == platform::Existence::Yes;
  });
}

// Removes a file by `remove`, then its sidecars. Returns those that went along.
std::vector<FileAlong> RemoveWithSidecars(const std::string& path,
                                          const std::string& commentExtension,
                                          Outcome (*remove)(const std::string&), Outcome& outcome,
                                          AlongTheWay& besides) {
  const std::vector<std::string> sidecars = platform::IsRegularFile(path)
                                                ? SidecarsOf(path, commentExtension)
                                                : std::vector<std::string>();
  std::vector<FileAlong> removed;
  outcome = remove(path);
  if (!outcome.empty()) return removed;
  for (const std::string& sidecar : sidecars) {
    const Outcome along = remove(sidecar);
    if (!along.empty()) {
      besides.failures.push_back({sidecar, along});
      continue;
    }
    besides.settled.insert(sidecar);
    removed.push_back({sidecar});
  }
  return removed;
}

// A step with the sidecars of its file. Notes in the step what went to the trash along with it, or
// was copied.
Outcome DoWithSidecars(const FileOperation& operation, FileStep& step, AlongTheWay& besides) {
  if (operation.kind == FileOperationKind::Trash) {
    Outcome outcome = CheckSeen(step);
    if (!outcome.empty()) return outcome;
    step.along =
        RemoveWithSidecars(step.from, operation.commentExtension, TrashOne, outcome, besides);
    return outcome;
  }
  std::vector<RenamedFile> sidecars = SidecarsAlong(operation, step.from, step.to);
  std::erase_if(sidecars, [&](const RenamedFile& one) { return besides.settled.contains(one.to); });
  if (AnyTaken(sidecars)) return Tr(kTaken);
  Outcome outcome = DoStep(operation.kind, step);
  if (!outcome.empty()) return outcome;
  if (!step.to.empty()) besides.settled.insert(step.to);
  step.along.clear();
  for (const RenamedFile& sidecar : sidecars) {
    const Outcome along = DoStep(operation.kind, {sidecar.from, sidecar.to});
    if (!along.empty()) {
      besides.failures.push_back({sidecar.from, along});
      continue;
    }
    besides.settled.insert(sidecar.to);
    if (operation.kind == FileOperationKind::Copy)
      step.along.push_back({sidecar.to, platform::StampOf(sidecar.to)});
  }
  return {};
}

// Undoes a step; adds the places that sidecars left. Only those that were copied or removed by the
// step are removed or restored with it, but all are renamed and moved.
Outcome UndoWithSidecars(const FileOperation& operation, const FileStep& step,
                         AlongTheWay& besides) {
  const bool copy = operation.kind == FileOperationKind::Copy;
  const std::vector<RenamedFile> sidecars =
      copy ? std::vector<RenamedFile>() : SidecarsAlong(operation, step.to, step.from);
  if (AnyTaken(sidecars)) return Tr(kTaken);
  Outcome outcome = UndoStep(operation.kind, step);
  if (!outcome.empty()) return outcome;
  const auto note = [&besides](const std::string& path, const Outcome& along) {
    if (!along.empty()) besides.failures.push_back({path, along});
  };
  for (const RenamedFile& sidecar : sidecars) {
    note(sidecar.from, MoveOne(sidecar.from, sidecar.to));
    besides.settled.insert(sidecar.from);
  }
  for (const FileAlong& one : step.along) {
    if (!copy) note(one.path, Restore(one.path));
    if (!copy) continue;
    if (!IsGone(one.path)) note(one.path, TrashOne(one.path));
    besides.settled.insert(one.path);
  }
  return {};
}

// How a completed step, or with `back` an undone one, affects thumbnails.
PictureChange ChangeBy(FileOperationKind kind, const FileStep& step, bool back) {
  switch (kind) {
    case FileOperationKind::Rename:
    case FileOperationKind::Move:
      return back ? PictureChange{step.to, step.from} : PictureChange{step.from, step.to};
    case FileOperationKind::Copy:
    case FileOperationKind::Create: return {step.to};
    case FileOperationKind::Turn:
    case FileOperationKind::Tag:
    case FileOperationKind::Change:
    case FileOperationKind::Times:
    case FileOperationKind::Trash: break;
  }
  return {step.from};
}

// Thumbnail files must be handled immediately, since the new picture may be older than an existing
// thumbnail file of its name; databases at the end.
void SettleThumbnailFile(FileOperationKind kind, const PictureChange& change) {
  if (!change.to.empty()) return FollowThumbnailFile(change.path, change.to);
  const bool contents = kind == FileOperationKind::Turn || kind == FileOperationKind::Tag ||
                        kind == FileOperationKind::Change;
  if (contents) return;  // already deleted
  if (platform::ExistenceOf(change.path) == platform::Existence::No)
    return DeleteThumbnailFile(change.path);
  DeleteMisleadingThumbnailFile(change.path);
}

}  // namespace

FileStep TimesStep(const ChangedTimes& changed) {
  return {.from = changed.path, .to = {}, .oldTimes = changed.before, .newTimes = changed.after};
}

FileOperation PlanFileOperation(FileOperationKind kind, const std::vector<std::string>& paths,
                                const std::string& folder, const FileOperationOptions& options) {
  FileOperation operation{kind, {}, options.commentExtension};
  std::set<std::string> planned;
  for (const std::string& path : paths) {
    if (kind == FileOperationKind::Trash) {
      operation.steps.push_back({path, {}});
      continue;
    }
    const std::string_view name = platform::FileNameOf(path);
    std::string target = platform::JoinFolder(folder, name);
    if (kind == FileOperationKind::Move && target == path) continue;
    if (target == path)
      target = platform::JoinFolder(folder, options.duplicatePrefix + std::string(name));
    const TakenTest taken = [&](const std::string& candidate) {
      return planned.contains(candidate) || AnyTaken(SidecarsAlong(operation, path, candidate))
                 ? platform::Existence::Yes
                 : platform::ExistenceOf(candidate);
    };
    if (taken(target) == platform::Existence::Yes) {
      (void)MakeNumberedVariant(target, options.firstVariant, options.lastVariant, taken);
    }
    planned.insert(target);
    operation.steps.push_back({path, target});
  }
  return operation;
}

FileOperationResult CarryOut(const FileOperation& operation,
                             const FileOperationProgress& progress) {
  FileOperationResult result{{operation.kind, {}, operation.commentExtension}, {}};
  std::vector<PictureChange> changes;
  AlongTheWay besides;
  for (size_t i = 0; i < operation.steps.size(); ++i) {
    if (progress && !progress(i, operation.steps.size())) break;
    FileStep step = operation.steps[i];
    if (besides.settled.contains(step.to.empty() ? step.from : step.to)) continue;
    const Outcome outcome = DoWithSidecars(operation, step, besides);
    if (outcome.empty()) {
      if (operation.kind == FileOperationKind::Copy) NoteCopy(step);
      changes.push_back(ChangeBy(operation.kind, step, false));
      SettleThumbnailFile(operation.kind, changes.back());
      result.done.steps.push_back(std::move(step));
    } else if (!WentWithPicture(step.from, changes)) {
      result.failures.push_back({step.from, outcome});
      result.left.push_back(std::move(step));
    }
  }
  result.failures.insert(result.failures.end(), besides.failures.begin(), besides.failures.end());
  MarkChangedRecords(changes);
  return result;
}

FileOperationResult Revert(const FileOperation& operation, const FileOperationProgress& progress) {
  FileOperationResult result{{operation.kind, {}, operation.commentExtension}, {}};
  std::vector<PictureChange> changes;
  AlongTheWay besides;
  for (size_t i = operation.steps.size(); i > 0; --i) {
    if (progress && !progress(operation.steps.size() - i, operation.steps.size())) break;
    const FileStep& step = operation.steps[i - 1];
    if (besides.settled.contains(step.to)) {
      result.done.steps.insert(result.done.steps.begin(), step);
      continue;
    }
    const Outcome outcome = UndoWithSidecars(operation, step, besides);
    if (outcome.empty()) {
      result.done.steps.insert(result.done.steps.begin(), step);
      changes.push_back(ChangeBy(operation.kind, step, true));
      SettleThumbnailFile(operation.kind, changes.back());
    } else {
      result.failures.push_back({step.to.empty() ? step.from : step.to, outcome});
      result.left.insert(result.left.begin(), step);
    }
  }
  result.failures.insert(result.failures.end(), besides.failures.begin(), besides.failures.end());
  MarkChangedRecords(changes);
  return result;
}

FileOperationResult DeleteForGood(const FileOperation& operation,
                                  const FileOperationProgress& progress) {
  FileOperationResult result{{FileOperationKind::Trash, {}}, {}};
  std::vector<PictureChange> changes;
  AlongTheWay besides;
  const auto remove = [](const std::string& path) { return DeleteTree(path, 0); };
  for (size_t i = 0; i < operation.steps.size(); ++i) {
    if (progress && !progress(i, operation.steps.size())) break;
    const FileStep& step = operation.steps[i];
    const std::string& path = step.from;
    if (besides.settled.contains(path)) continue;
    Outcome outcome = CheckSeen(step);
    if (outcome.empty())
      (void)RemoveWithSidecars(path, operation.commentExtension, remove, outcome, besides);
    if (!outcome.empty()) {
      if (!WentWithPicture(path, changes)) result.failures.push_back({path, outcome});
      continue;
    }
    result.done.steps.push_back(step);
    changes.push_back({path});
    DeleteThumbnailFile(path);
  }
  result.failures.insert(result.failures.end(), besides.failures.begin(), besides.failures.end());
  MarkChangedRecords(changes);
  return result;
}

std::vector<FileUse> UsesOf(const FileOperation& operation, bool back) {
  const auto now = static_cast<int32_t>(platform::Now());
  std::vector<FileUse> uses;
  const auto use = [&](const std::string& path, FileFunction function,
                       const std::string& from = {}) {
    uses.push_back({.path = path, .function = function, .accessed = now, .from = from});
  };
  const auto gone = [&](const std::string& path) {
    uses.push_back({.path = path, .accessed = now, .removed = true});
  };
  for (const FileStep& step : operation.steps) {
    switch (operation.kind) {
      case FileOperationKind::Rename:
      case FileOperationKind::Move:
        use(back ? step.from : step.to, FileFunction::MoveAndCopy, back ? step.to : step.from);
        break;
      case FileOperationKind::Copy:
        if (back) gone(step.to);
        if (!back) use(step.from, FileFunction::MoveAndCopy);
        break;
      case FileOperationKind::Create:
        if (back) gone(step.to);
        break;
      case FileOperationKind::Turn:
      case FileOperationKind::Tag:
      case FileOperationKind::Change:
        if (!back) use(step.from, FileFunction::Transform);
        break;
      case FileOperationKind::Times:
        if (!back) use(step.from, FileFunction::FileTime);
        break;
      case FileOperationKind::Trash:
        if (!back) gone(step.from);
        break;
    }
  }
  return uses;
}

std::string FileOperationName(const FileOperation& operation) {
  const size_t count = operation.steps.size();
  const std::string_view name =
      count == 1 ? platform::FileNameOf(operation.steps[0].from) : std::string_view();
  const auto named = [&](const char* one, std::string many) {
    return count == 1 ? Tr(one, name) : std::move(many);
  };
  switch (operation.kind) {
    case FileOperationKind::Rename:
      return named(TrLater("rename of %1"),
                   TrCount("rename of %1 file", "rename of %1 files", count));
    case FileOperationKind::Move:
      return named(TrLater("move of %1"), TrCount("move of %1 file", "move of %1 files", count));
    case FileOperationKind::Copy:
      return named(TrLater("copy of %1"), TrCount("copy of %1 file", "copy of %1 files", count));
    case FileOperationKind::Create:
      return named(TrLater("output of %1"),
                   TrCount("output of %1 file", "output of %1 files", count));
    case FileOperationKind::Turn:
      return named(TrLater("rotation of %1"),
                   TrCount("rotation of %1 file", "rotation of %1 files", count));
    case FileOperationKind::Tag:
      return named(TrLater("tags of %1"), TrCount("tags of %1 file", "tags of %1 files", count));
    case FileOperationKind::Change:
      return named(TrLater("change of %1"),
                   TrCount("change of %1 file", "change of %1 files", count));
    case FileOperationKind::Times:
      return named(TrLater("times of %1"), TrCount("times of %1 file", "times of %1 files", count));
    case FileOperationKind::Trash: break;
  }
  return named(TrLater("deletion of %1"),
               TrCount("deletion of %1 file", "deletion of %1 files", count));
}

}  // namespace fotomill
