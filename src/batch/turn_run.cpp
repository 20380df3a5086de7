#include "batch/turn_run.h"

#include <atomic>
#include <memory>
#include <mutex>
#include <new>
#include <optional>
#include <utility>
#include <vector>

#include "batch/abort.h"
#include "batch/destination_name.h"
#include "batch/ordered_run.h"
#include "batch/run_names.h"
#include "core/settings.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/process.h"

namespace fotomill {

namespace {

FileOutcome Failure(const BatchFile& file, Status status, std::string hint) {
  return {.source = file.name, .status = status, .hint = std::move(hint)};
}

class TurnBatch {
 public:
  TurnBatch(std::span<const BatchFile> files, const TurnFunction& function, BatchJob& job)
      : files_(files), function_(function), job_(job), outcomes_(files.size()) {
    for (const BatchFile& file : files_) {
      if (file.status == Status::Ok) names_.AddSource(file.name, Planned(file));
    }
  }

  void Run() {
    OrderedRun run({.work = [this](size_t i) { Work(i); },
                    .deliver = [this](size_t i) { Deliver(i); },
                    .goesOn = [this] { return !ended_ && !AbortAsked(); },
                    .tick = [this] { Tick(); }});
    run_ = &run;
    run.Run(files_.size(), function_.jobs == 0 ? platform::CoreCount() : function_.jobs);
  }

 private:
  std::string Planned(const BatchFile& file) const {
    if (function_.inPlace) return file.name;
    const std::string folder = function_.keepTree && !file.below.empty()
                                   ? platform::JoinFolder(job_.destinationFolder, file.below)
                                   : job_.destinationFolder;
    return platform::JoinFolder(folder, platform::FileNameOf(file.name));
  }

  void Work(size_t i) {
    std::optional<FileOutcome> outcome;
    try {
      outcome = Process(i);
    } catch (const std::bad_alloc&) {
      outcome = Failure(files_[i], Status::MemoryAllocationError, {});
    }
    if (outcome) outcomes_[i] = std::make_unique<FileOutcome>(std::move(*outcome));
  }

  void Deliver(size_t i) {
    const std::unique_ptr<FileOutcome> outcome = std::move(outcomes_[i]);
    if (outcome == nullptr) return;
    job_.source.AssignCut(outcome->source);
    const bool written = !outcome->destination.empty() && !outcome->skipped && !function_.dryRun;
    if (written) NoteUse(outcome->source);
    job_.filesChanged = job_.filesChanged || written;
    if (outcome->skipped && outcome->status != Status::Ok) ++job_.writeAborts;
    ReportOutcome(job_, *outcome, static_cast<uint32_t>(i), static_cast<uint32_t>(files_.size()));
    if (job_.box != nullptr && !job_.box->GoesOn()) ended_ = true;
  }

  void Tick() {
    if (job_.box == nullptr) return;
    job_.box->Tick();
    if (!job_.box->GoesOn()) ended_ = true;
  }

  void NoteUse(const std::string& source) {
    if ((settings.FileHistoryFunctions >> static_cast<int32_t>(FileFunction::Transform) & 1) == 0) return;
    job_.uses.push_back({names_.Key(source), FileFunction::Transform, kOwnTime, static_cast<int32_t>(platform::Now()), false});
  }

  // nullopt for a file that was given up by Abort before it had a name.
  std::optional<FileOutcome> Process(size_t i) {
    const BatchFile& file = files_[i];
    if (file.status != Status::Ok) return Failure(file, file.status, file.hint);
    FileOutcome outcome{.source = file.name, .destination = Planned(file)};
    if (function_.inPlace && platform::FactsOf(file.name).link) {
      return Failure(file, Status::ErrorCreatingFile, "It is a link; name the file that it leads to.");
    }
    bool goesOn = true;
    if (names_.ConcernsNobodyElse(file.name, outcome.destination)) {
      goesOn = Settle(outcome);
    } else if (!run_->InTurn(i, [&] { goesOn = Settle(outcome); })) {
      return std::nullopt;
    }
    if (goesOn && !function_.dryRun) Turn(outcome);
    return outcome;
  }

  // Gives a file its destination. False when it is left out.
  bool Settle(FileOutcome& outcome) {
    const std::lock_guard lock(mutex_);
    const std::string planned = outcome.destination;
    if (function_.inPlace) {
      outcome.skipped = names_.TakenByRun(planned, outcome.source);
      if (outcome.skipped) outcome.hint = "is turned already; it is named twice.";
      outcome.replaced = true;
    } else if (names_.Taken(planned, outcome.source)) {
      SettleTaken(outcome);
    }
    if (!outcome.skipped) names_.Give(outcome.destination);
    return !outcome.skipped;
  }

  void SettleTaken(FileOutcome& outcome) {
    const bool byRun = names_.TakenByRun(outcome.destination, outcome.source);
    outcome.replaced = !job_.overwrite.prompt && !byRun;
    if (outcome.replaced && !job_.overwrite.skip) return;
    const TakenTest taken = [&](const std::string& path) { return names_.Taken(path, outcome.source); };
    outcome.replaced = false;
    outcome.skipped = job_.overwrite.skip;
    if (outcome.skipped) {
      outcome.hint = "skipped, " + outcome.destination + " exists.";
    } else if (!names_.MakeVariant(outcome.destination, job_.naming.firstVariant, job_.naming.lastVariant, taken)) {
      outcome.skipped = true;
      outcome.status = Status::ErrorCreatingFile;
      outcome.hint = kWriteAborted;
    }
  }

  void Turn(FileOutcome& outcome) const {
    const std::string folder(platform::SplitPath(outcome.destination).folder);
    WriteOptions options;
    options.existing = outcome.replaced ? platform::Existing::Replace : platform::Existing::Refuse;
    bool kept = true;
    if (function_.inPlace && function_.keepPrevious) {
      options.makeWay = [&] { return kept = function_.keepPrevious(outcome.source); };
    }
    TurnedFile turned;
    if (!folder.empty() && !platform::MakeFolders(folder)) {
      turned = {.status = Status::ErrorCreatingFile, .hint = "There is no folder \"" + folder + "\"."};
    } else {
      turned = TurnPictureFile(outcome.source, outcome.destination, function_.request, options);
    }
    outcome.status = turned.status;
    outcome.hint = kept ? turned.hint : std::string("There is no room to keep the old file for undo.");
    outcome.note = turned.note;
    outcome.skipped = turned.status == Status::Ok && !turned.changed;
    if (outcome.skipped) outcome.hint = "stands so already.";
    if (turned.status != Status::Ok) outcome.destination.clear();
  }

  const std::span<const BatchFile> files_;
  const TurnFunction& function_;
  BatchJob& job_;
  std::vector<std::unique_ptr<FileOutcome>> outcomes_;  // of files that are done and not yet reported
  OrderedRun* run_ = nullptr;
  std::atomic<bool> ended_{false};
  std::mutex mutex_;  // over what is given to names_
  RunNames names_;
};

}  // namespace

Status RunTurn(std::span<const BatchFile> files, const TurnFunction& function, BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  TurnBatch(files, function, job).Run();
  FinishProgress(job);
  return Status::Ok;
}

}  // namespace fotomill
