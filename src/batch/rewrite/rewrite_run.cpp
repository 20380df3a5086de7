#include "batch/rewrite/rewrite_run.h"

#include <mutex>
#include <optional>
#include <utility>

#include "batch/destination_name.h"
#include "batch/reported_run.h"
#include "batch/run_names.h"
#include "platform/files.h"
#include "platform/output_file.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

FileOutcome Failure(const BatchFile& file, Status status, std::string hint) {
  return {.source = file.name, .status = status, .hint = std::move(hint)};
}

class RewriteBatch {
 public:
  RewriteBatch(std::span<const BatchFile> files, const RewriteFunction& function, BatchJob& job)
      : files_(files),
        function_(function),
        job_(job),
        run_(files, job,
             {.process =
                  [this](size_t i) {
                    const auto outcome = Process(i);
                    return outcome ? std::vector{*outcome} : std::vector<FileOutcome>();
                  },
              .history = function.history,
              .dryRun = function.dryRun}) {
    for (const BatchFile& file : files_) {
      if (file.status == Status::Ok) {
        names_.AddSource(file.name);
        names_.AddPlanned(Planned(file));
      }
    }
  }

  void Run() { run_.Run(function_.jobs); }

 private:
  std::string Planned(const BatchFile& file) const {
    if (function_.inPlace) return file.name;
    if (!function_.out.empty()) return function_.out;
    const std::string folder = function_.keepTree && !file.below.empty()
                                   ? platform::JoinFolder(job_.destinationFolder, file.below)
                                   : job_.destinationFolder;
    return platform::JoinFolder(folder, platform::FileNameOf(file.name));
  }

  // On any thread. nullopt if canceled before the file had a name.
  std::optional<FileOutcome> Process(size_t i) {
    const BatchFile& file = files_[i];
    if (file.status != Status::Ok) return Failure(file, file.status, file.hint);
    FileOutcome outcome{.source = file.name, .destination = Planned(file)};
    if (function_.inPlace && platform::FactsOf(file.name).link) {
      return Failure(file, Status::ErrorCreatingFile,
                     Tr("This is a link; name the file it points to."));
    }
    bool goesOn = true;
    if (names_.ConcernsNobodyElse(file.name, outcome.destination)) {
      goesOn = Settle(outcome);
    } else if (!run_.InTurn(i, [&] { goesOn = Settle(outcome); })) {
      return std::nullopt;
    }
    if (!goesOn && outcome.status != Status::Ok && job_.stop.Token().Asked()) return std::nullopt;
    if (goesOn) Rewrite(outcome);
    return outcome;
  }

  // Chooses the destination of a file. False if it is skipped.
  bool Settle(FileOutcome& outcome) {
    const std::lock_guard lock(mutex_);
    const std::string planned = outcome.destination;
    if (function_.inPlace) {
      outcome.skipped = names_.TakenByRun(planned, outcome.source);
      if (outcome.skipped) outcome.hint = Tr(function_.listedTwice);
      outcome.replaced = true;
    } else if (const platform::Existence taken = names_.Taken(planned, outcome.source);
               taken == platform::Existence::Yes) {
      SettleTaken(outcome);
    } else if (taken == platform::Existence::Unknown) {
      Destination destination;
      destination.path = planned;
      destination.search = VariantSearch::Unknown;
      SayNoName(destination, outcome);
    }
    const bool goesOn = !outcome.skipped && outcome.status == Status::Ok;
    if (goesOn) names_.Give(outcome.destination);
    return goesOn;
  }

  void SettleTaken(FileOutcome& outcome) {
    const bool byRun = names_.TakenByRun(outcome.destination, outcome.source);
    outcome.replaced = !job_.overwrite.prompt && !byRun;
    if (outcome.replaced && !job_.overwrite.skip) return;
    const TakenTest taken = [&](const std::string& path) {
      return names_.Taken(path, outcome.source);
    };
    outcome.replaced = false;
    outcome.skipped = job_.overwrite.skip;
    if (outcome.skipped) {
      outcome.hint = Tr("skipped: %1 exists.", outcome.destination);
      return;
    }
    Destination destination;
    destination.path = outcome.destination;
    destination.search = names_.MakeVariant(outcome.destination, job_.naming.firstVariant,
                                            job_.naming.lastVariant, taken, job_.stop.Token());
    if (destination.search != VariantSearch::Found) {
      SayNoName(destination, outcome);
    } else if (byRun) {
      outcome.note = SharedNameNote(destination.path);
    }
  }

  // `kept` becomes false if a file could not be kept for undo.
  RewriteRequest RequestFor(bool& kept) const {
    RewriteRequest request{function_.keepTimes, function_.dryRun, job_.stop.Token()};
    if (!function_.inPlace) return request;
    request.replaced = function_.replaced;
    if (function_.keepPrevious)
      request.keepPrevious = [&](const std::string& path) {
        return kept = function_.keepPrevious(path);
      };
    return request;
  }

  void Rewrite(FileOutcome& outcome) const {
    const std::string folder(platform::SplitPath(outcome.destination).folder);
    WriteOptions options{.encode = job_.encode};
    options.comment = job_.writeComments;
    options.existing = outcome.replaced ? platform::Existing::Replace : platform::Existing::Refuse;
    bool kept = true;
    if (function_.inPlace && function_.keepPrevious) {
      options.makeWay = [&] { return kept = function_.keepPrevious(outcome.source); };
    }
    RewrittenFile made;
    const bool ready = function_.dryRun
                           ? platform::IsFolder(folder) || platform::MayCreate(outcome.destination)
                           : platform::MakeFolders(folder);
    if (!folder.empty() && !ready) {
      made = {.status = Status::ErrorCreatingFile,
              .hint = WithReason(Tr("The folder \"%1\" does not exist.", folder))};
    } else {
      made = function_.rewrite(outcome.source, outcome.destination,
                               RequestFor(kept), options);
    }
    if (made.changed && function_.inPlace && function_.replaced) function_.replaced(outcome.source);
    outcome.status = made.status;
    outcome.hint =
        kept ? made.hint
             : std::string(Tr("There is not enough disk space to keep the old file for undo."));
    outcome.note.Append(made.note);
    if (made.changed) NoteLostAttributes(outcome);
    outcome.skipped = made.status == Status::Ok && !made.changed;
    if (outcome.skipped)
      outcome.hint = made.note.empty() ? Tr(function_.unchanged) : made.note.shown;
    if (made.status != Status::Ok) outcome.destination.clear();
  }

  const std::span<const BatchFile> files_;
  const RewriteFunction& function_;
  BatchJob& job_;
  std::mutex mutex_;  // guards the names given by names_
  RunNames names_;
  ReportedRun run_;  // must be last: its threads use the other members
};

}  // namespace

Status RunRewrite(std::span<const BatchFile> files, const RewriteFunction& function,
                  BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  RewriteBatch(files, function, job).Run();
  FinishProgress(job);
  return Status::Ok;
}

}  // namespace fotomill
