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
#include "batch/batch_file.h"

namespace fotomill {

// Runs every kind of batch: files are processed on several threads; outcomes are reported to the
// job's box on the calling thread in selection order, written files are added to the file history,
// and outdated thumbnails are removed.
class ReportedRun {
 public:
  // How to process and record files.
  struct Task {
    // On any thread: returns an outcome per output
    // of the file; none if canceled by Abort.
    std::function<std::vector<FileOutcome>(size_t file)> process;
    FileFunction history = FileFunction::Convert;
    bool dryRun = false;
  };

  // `files` and `job` must outlive this object.
  ReportedRun(std::span<const BatchFile> files, BatchJob& job, Task task);

  // Processes at most `jobs` files at a time; 0: one per core.
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
  // of finished files not yet reported; none: canceled
  std::vector<std::vector<FileOutcome>> outcomes_;
  std::atomic<bool> ended_{false};
  const std::thread::id caller_ = std::this_thread::get_id();
  std::mutex workMutex_;     // guards the following members
  std::set<size_t> inWork_;  // in order of their start
  uint32_t done_ = 0;
  OrderedRun run_;
};

}  // namespace fotomill
