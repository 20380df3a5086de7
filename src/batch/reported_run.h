#pragma once

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <set>
#include <span>
#include <string>
#include <thread>
#include <vector>

#include "batch/job.h"
#include "core/workers/ordered_run.h"
#include "batch/run.h"

namespace fotomill {

// How every batch over files runs: each is worked on, on some thread, into an outcome; outcomes are
// reported on the calling thread in the order of the selection, to the job's box, and what was
// written goes into the file history; thumbnails of what was there before go.
class ReportedRun {
 public:
  // What is done with each file, and how it is recorded.
  struct Task {
    // On any thread: an outcome for each output of the file. None for a file that was given up by
    // Abort.
    std::function<std::vector<FileOutcome>(size_t file)> process;
    FileFunction history = FileFunction::Convert;
    bool dryRun = false;
  };

  // Files and job must outlive the run.
  ReportedRun(std::span<const BatchFile> files, BatchJob& job, Task task);

  // At most `jobs` files at a time; 0: one per core.
  void Run(uint32_t jobs);
  // As OrderedRun::InTurn.
  bool InTurn(size_t file, const std::function<void()>& step) { return run_.InTurn(file, step); }

 private:
  class AtWork;
  static uint32_t CoreJobs();
  Status Work(size_t file);
  void Deliver(size_t file, Status status);
  void Report(size_t file, const FileOutcome& outcome);
  void Tick();
  void NoteUse(const std::string& source);
  void NoteChange(const FileOutcome& outcome);
  void ShowWork();

  const std::span<const BatchFile> files_;
  BatchJob& job_;
  const Task task_;
  const StopToken stop_;
  // of files that are done and not yet reported; none: given up
  std::vector<std::vector<FileOutcome>> outcomes_;
  std::atomic<bool> ended_{false};
  const std::thread::id caller_ = std::this_thread::get_id();
  std::mutex workMutex_;     // over what follows
  std::set<size_t> inWork_;  // the first one was begun first
  uint32_t done_ = 0;
  OrderedRun run_;
};

}  // namespace fotomill
