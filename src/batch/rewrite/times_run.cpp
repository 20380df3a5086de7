#include "batch/rewrite/times_run.h"

#include <optional>

#include "batch/reported_run.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

class TimesBatch {
 public:
  TimesBatch(std::span<const BatchFile> files, const TimesFunction& function, BatchJob& job)
      : files_(files),
        function_(function),
        changer_(function.rule, function.dryRun),
        run_(files, job,
             {.process = [this](size_t i) { return Process(i); },
              .history = FileFunction::FileTime,
              .dryRun = function.dryRun}) {}

  void Run() { run_.Run(0); }

 private:
  // On any thread: pictures are read at the same time, files changed in turn, as the time of one
  // may depend on that of the one before.
  std::vector<FileOutcome> Process(size_t i) {
    const BatchFile& file = files_[i];
    FileTimeChange change{.status = file.status, .hint = file.hint};
    PictureTags tags;
    if (change.status == Status::Ok && function_.rule.taken)
      change.status = ReadPictureTags(file.name, function_.sources, tags);
    const bool inTurn = run_.InTurn(i, [&] {
      if (change.status == Status::Ok) change = changer_.Change(file.name, tags.taken);
      if (function_.changed) function_.changed(file.name, change);
    });
    if (!inTurn) return {};
    FileOutcome outcome{.source = file.name, .status = change.status, .hint = change.hint};
    if (change.status != Status::Ok) return {outcome};
    outcome.destination = file.name;
    outcome.replaced = true;
    const std::string before = LocalTimeText(change.before.seconds);
    const std::string after = LocalTimeText(change.after.seconds);
    outcome.note = TrRecorded("%1, was %2", after, before);
    return {outcome};
  }

  const std::span<const BatchFile> files_;
  const TimesFunction& function_;
  FileTimeChanger changer_;  // used in turn
  ReportedRun run_;          // must be last: its threads use the other members
};

}  // namespace

Status RunFileTimes(std::span<const BatchFile> files, const TimesFunction& function,
                    BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  TimesBatch(files, function, job).Run();
  FinishProgress(job);
  return Status::Ok;
}

}  // namespace fotomill
