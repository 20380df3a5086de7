#include "batch/reported_run.h"

#include <algorithm>
#include <utility>

#include "core/workers/folder_scope.h"
#include "platform/clock.h"
#include "platform/folders.h"
#include "platform/process.h"

namespace fotomill {

ReportedRun::ReportedRun(std::span<const BatchFile> files, BatchJob& job, Task task)
    : files_(files),
      job_(job),
      task_(std::move(task)),
      stop_(job.stop.Token()),
      outcomes_(files.size()),
      run_({.work = [this](size_t file) { return Work(file); },
            .deliver = [this](size_t file, Status status) { Deliver(file, status); },
            .goesOn = [this] { return !ended_ && !stop_.Asked(); },
            .tick = [this] { Tick(); }}) {}

// Marks a file as being processed during its lifetime.
class ReportedRun::AtWork {
 public:
  AtWork(ReportedRun& run, size_t file) : run_(run), file_(file) {
    const std::lock_guard lock(run_.workMutex_);
    run_.inWork_.insert(file_);
  }
  ~AtWork() {
    const std::lock_guard lock(run_.workMutex_);
    run_.inWork_.erase(file_);
    ++run_.done_;
  }
  AtWork(const AtWork&) = delete;
  AtWork& operator=(const AtWork&) = delete;

 private:
  ReportedRun& run_;
  const size_t file_;
};

void ReportedRun::Run(uint32_t jobs) {
  ShowWork();
  run_.Run(files_.size(), jobs == 0 ? CoreJobs() : jobs);
  MarkChangedRecords(std::exchange(job_.changes, {}));
}

uint32_t ReportedRun::CoreJobs() { return platform::CoreCount(); }

Status ReportedRun::Work(size_t file) {
  const FolderScope folder(files_[file].name);
  const AtWork atWork(*this, file);
  if (std::this_thread::get_id() == caller_) ShowWork();  // the caller will not tick meanwhile
  outcomes_[file] = task_.process(file);
  return Status::Ok;
}

// On the calling thread.
void ReportedRun::ShowWork() {
  if (job_.box == nullptr) return;
  ProgressWork work{.count = static_cast<uint32_t>(files_.size()), .file = {}};
  {
    const std::lock_guard lock(workMutex_);
    work.done = done_;
    work.inWork = static_cast<uint32_t>(inWork_.size());
    if (!inWork_.empty()) work.file = files_[*inWork_.begin()].name;
  }
  job_.box->ShowWork(work);
}

void ReportedRun::Deliver(size_t file, Status status) {
  std::vector<FileOutcome> outcomes = std::move(outcomes_[file]);
  if (status != Status::Ok) outcomes = {FileOutcome{.source = files_[file].name, .status = status}};
  // A canceled file left nothing behind; report it like one that was never started.
  if (stop_.Asked())
    std::erase_if(outcomes, [](const FileOutcome& outcome) {
      return outcome.status == Status::FunctionCancelled;
    });
  if (outcomes.empty()) return;
  job_.source.AssignCut(outcomes[0].source);
  // An output whose time could not be set was written, too; one that was not has no destination.
  const auto isWritten = [&](const FileOutcome& outcome) {
    return !outcome.destination.empty() && !outcome.skipped && !task_.dryRun;
  };
  if (std::ranges::any_of(outcomes, isWritten)) {
    NoteUse(outcomes[0].source);
    job_.filesChanged = true;
  }
  for (const FileOutcome& outcome : outcomes) {
    if (isWritten(outcome)) NoteChange(outcome);
    Report(file, outcome);
  }
}

void ReportedRun::Report(size_t file, const FileOutcome& outcome) {
  if (outcome.skipped && outcome.status != Status::Ok) ++job_.writeAborts;
  ReportOutcome(job_, outcome, static_cast<uint32_t>(file), static_cast<uint32_t>(files_.size()));
  if (job_.box != nullptr && !job_.box->GoesOn()) ended_ = true;
}

void ReportedRun::Tick() {
  if (job_.box == nullptr) return;
  ShowWork();
  job_.box->Tick();
  if (!job_.box->GoesOn()) ended_ = true;
}

// Unless a file was replaced, a thumbnail file of that name may belong to another picture.
void ReportedRun::NoteChange(const FileOutcome& outcome) {
  const std::string path = platform::AbsolutePath(outcome.destination);
  job_.changes.push_back({path});
  if (outcome.replaced) DeleteThumbnailFile(path);
}

void ReportedRun::NoteUse(const std::string& source) {
  if ((job_.historyFunctions >> static_cast<uint32_t>(task_.history) & 1) == 0) return;
  const auto now = static_cast<int32_t>(platform::Now());
  job_.uses.push_back({platform::AbsolutePath(source), task_.history, kOwnTime, now, false});
}

}  // namespace fotomill
