#include "batch/rename/pattern_rename.h"

#include <set>
#include <utility>
#include <vector>

#include "batch/picture_failure.h"
#include "batch/progress_box.h"
#include "batch/rename/renamed_files.h"
#include "core/plain_name.h"
#include "core/workers/ordered_run.h"
#include "metadata/exif/exif_source.h"
#include "operations/macros.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// A file on its way to a new name.
struct Candidate {
  std::string from, to;  // absolute; `to` is empty if there is no new name
  FileOutcome outcome = {};
};

// Reads what the macros of a pattern need; any thread.
Status ReadForMacros(const std::string& path, std::string_view pattern, const ReadOptions& read,
                     PicturePointer& picture) {
  if (NeedsPictureSize(pattern))
    return LoadPictureInfo({.fileName = path, .options = read}, picture);
  picture = NewPictureRecord();
  if (picture == nullptr) return Status::MemoryAllocationError;
  if (IsKnownEarly(pattern)) return Status::Ok;
  ExifSource exif;
  const Status status = exif.Open(path.c_str());
  if (status == Status::Ok) picture->metadata.exif.assign(exif.Block().begin(), exif.Block().end());
  // damaged metadata are as good as none
  return status == Status::FileOpenError || status == Status::MemoryAllocationError ? status
                                                                                    : Status::Ok;
}

std::string_view WithoutBlanks(std::string_view name) {
  name.remove_prefix(std::min(name.find_first_not_of(' '), name.size()));
  return name.substr(0, name.find_last_not_of(' ') + 1);
}

class PatternRename {
 public:
  PatternRename(std::span<const BatchFile> files, const PatternRenameOptions& options,
                BatchJob& job)
      : files_(files), options_(options), job_(job), candidates_(files.size()) {}

  void Run() {
    TakeSources();
    MakeNames();
    if (Stopped()) return;
    RefuseDuplicates();
    RenameLog log;
    RenamedFiles renamed(options_.dryRun, &log, options_.commentExtension);
    CarryOut(renamed);
    for (size_t i = 0; i < candidates_.size(); ++i) {
      if (!candidates_[i].outcome.source.empty())
        ReportOutcome(job_, candidates_[i].outcome, done_++, static_cast<uint32_t>(files_.size()));
    }
  }

 private:
  bool Stopped() const {
    return job_.stop.Token().Asked() || (job_.box != nullptr && !job_.box->GoesOn());
  }

  void TakeSources() {
    std::set<std::string> seen;
    const std::set<std::string> sidecars = SidecarsOfListed(files_, options_.commentExtension);
    for (size_t i = 0; i < files_.size(); ++i) {
      Candidate& candidate = candidates_[i];
      candidate.from = platform::AbsolutePath(files_[i].name);
      candidate.outcome = {.source = files_[i].name,
                           .destination = files_[i].name,
                           .status = files_[i].status,
                           .hint = files_[i].hint};
      if (candidate.outcome.status != Status::Ok) continue;
      if (!platform::IsRegularFile(candidate.from)) {
        candidate.outcome.status = Status::FileOpenError;
      } else if (!seen.insert(candidate.from).second) {
        candidate.outcome.skipped = true;
        candidate.outcome.hint = Tr("skipped: it is listed twice.");
      } else if (sidecars.contains(candidate.from)) {
        candidate.outcome.skipped = true;
        candidate.outcome.hint = Tr(kRenamedWithPicture);
      }
    }
  }

  static bool IsOpen(const Candidate& candidate) {
    return candidate.outcome.status == Status::Ok && !candidate.outcome.skipped;
  }

  void MakeNames() {
    std::vector<int64_t> numbers(files_.size());
    int64_t number = options_.start;
    for (size_t i = 0; i < files_.size(); ++i) {
      numbers[i] = number;
      if (IsOpen(candidates_[i])) number += options_.increment;
    }
    OrderedRun run({.work =
                        [&](size_t i) {
                          if (IsOpen(candidates_[i])) MakeName(candidates_[i], numbers[i]);
                          return Status::Ok;
                        },
                    .deliver =
                        [&](size_t i, Status status) {
                          if (status != Status::Ok) candidates_[i].outcome.status = status;
                        },
                    .goesOn = [stop = job_.stop.Token()] { return !stop.Asked(); },
                    .tick =
                        [this] {
                          if (job_.box != nullptr) job_.box->Tick();
                        }});
    run.Run(files_.size(), platform::CoreCount());
  }

  // On any thread.
  void MakeName(Candidate& candidate, int64_t number) const {
    FileOutcome& outcome = candidate.outcome;
    const std::string pattern = ExpandCounter(options_.pattern, number);
    PicturePointer picture;
    outcome.status = ReadForMacros(candidate.from, pattern, job_.read, picture);
    if (outcome.status != Status::Ok) {
      outcome.hint = OpenHint(candidate.from, outcome.status);
      return;
    }
    const MacroFacts facts{.fileName = candidate.from,
                           .copyrightHolder = options_.copyrightHolder,
                           .modified = platform::FactsOf(candidate.from).modified};
    const std::string expanded = ExpandNameMacros(pattern, facts, *picture);
    const std::string_view base = WithoutBlanks(expanded);
    const platform::PathParts old = platform::SplitPath(candidate.from);
    candidate.to = platform::JoinPath({old.drive, old.folder, base, old.extension});
    const platform::PathParts given = platform::SplitPath(outcome.source);
    const std::string destination =
        platform::JoinPath({given.drive, given.folder, base, given.extension});
    if (base.empty() || !IsPlainName(base)) {
      Refuse(candidate, base.empty() ? Tr("The new name would be empty.")
                                     : Tr("The new name would not be a file name."));
    } else if (candidate.to.size() > PathText::Capacity()) {
      Refuse(candidate, Tr("The path would be longer than 260 characters."));
    } else if (candidate.to == candidate.from) {
      outcome.skipped = true;
      outcome.hint = Tr("skipped: it has this name already.");
    } else {
      outcome.destination = destination;
    }
  }

  static void Refuse(Candidate& candidate, std::string reason) {
    candidate.outcome.status = Status::RenameError;
    candidate.outcome.hint = std::move(reason);
  }

  void RefuseDuplicates() {
    std::set<std::string> names;
    for (Candidate& candidate : candidates_) {
      if (IsOpen(candidate) && !names.insert(candidate.to).second) {
        Refuse(
            candidate,
            Tr("\"%1\" is the new name of another file; a counter such as %03c tells them apart.",
               platform::FileNameOf(candidate.to)));
      }
    }
  }

  void CarryOut(RenamedFiles& renamed) {
    std::vector<RenamedFile> wanted;
    std::vector<Candidate*> owners;
    for (Candidate& candidate : candidates_) {
      if (!IsOpen(candidate)) continue;
      wanted.push_back({candidate.from, candidate.to});
      owners.push_back(&candidate);
    }
    const std::vector<RenameAttempt> attempts = CarryOutRenames(wanted, renamed, job_);
    for (size_t i = 0; i < attempts.size(); ++i) {
      FileOutcome& outcome = owners[i]->outcome;
      if (!attempts[i].reached) {
        outcome = {};  // not reported
      } else if (attempts[i].done) {
        if (!attempts[i].noted) outcome.note = TrRecorded(kRenameNotNoted);
      } else if (WentWithPicture(owners[i]->from, job_.changes) ||
                 renamed.WentAlong(owners[i]->from)) {
        outcome.skipped = true;
        outcome.destination = outcome.source;
        outcome.hint = Tr(kRenamedWithPicture);
      } else {
        Refuse(*owners[i], attempts[i].reason);
      }
    }
  }

  const std::span<const BatchFile> files_;
  const PatternRenameOptions& options_;
  BatchJob& job_;
  std::vector<Candidate> candidates_;
  uint32_t done_ = 0;
};

}  // namespace

RecordedText PatternProblem(std::string_view pattern) {
  const std::string counted = ExpandCounter(pattern, 1);
  RecordedText problem = MacroProblem(counted);
  if (problem.empty() && WithoutBlanks(pattern).empty()) problem = TrRecorded("is empty");
  // separators in expansions are replaced, but not those of the pattern itself
  if (problem.empty() && !IsPlainName(pattern)) {
    problem = TrRecorded("must be part of a file name, not a path");
  }
  return problem;
}

void RunPatternRename(std::span<const BatchFile> files, const PatternRenameOptions& options,
                      BatchJob& job) {
  if (!OpenProgressBox(job)) return;
  PatternRename(files, options, job).Run();
  MarkChangedRecords(std::exchange(job.changes, {}));
  FinishProgress(job);
}

}  // namespace fotomill
