#pragma once

#include <atomic>
#include <cstdint>
#include <string>
#include <vector>

#include "catalog/thumbnails/thumbnail_database.h"
#include "core/progress.h"
#include "core/workers/background_task.h"

namespace fotomill::desktop {

// Compacts a thumbnail database on its own
// thread, for a window that shows the progress.
class DatabaseCompaction : private ProgressSink {
 public:
  // Starts immediately; `purge` also drops thumbnails of missing pictures; with `hidden` the new
  // file is hidden.
  DatabaseCompaction(std::string path, bool purge, bool hidden);
  // Stops and waits; the database is unchanged unless it has finished.
  ~DatabaseCompaction() override = default;
  DatabaseCompaction(const DatabaseCompaction&) = delete;
  DatabaseCompaction& operator=(const DatabaseCompaction&) = delete;

  // Cancels; whether it has ended either way; number of records processed.
  void Stop() { task_.Stop(); }
  bool Ended() const { return ended_; }
  int32_t Done() const { return done_; }
  int32_t Total() const { return total_; }  // records, 0 until known

  // The result after it has ended, a sentence or two.
  bool Succeeded() const { return succeeded_; }
  const std::string& Outcome() const { return outcome_; }

 private:
  void Step(int32_t done, int32_t total) override;
  void Run(bool purge, const StopToken& stop);

  const std::string path_;
  const bool hidden_;
  std::atomic<bool> ended_{false};
  std::atomic<int32_t> done_{0}, total_{0};
  bool succeeded_ = false;  // written before `ended_`
  std::string outcome_;
  BackgroundTask task_;  // must be last: it uses the other members
};

// "1,234 records, 35.1 MB", or why it cannot be compacted.
std::string DescribeDatabase(const std::string& path);

// Orphaned thumbnail files in a folder, with
// `below` also in subfolders. Skips optical drives
// and unreadable folders. Ends early if stopped.
std::vector<std::string> FindOrphanThumbnails(const std::string& folder, bool below,
                                              const StopToken& stop);
// Deletes the files; returns those that could not be deleted.
std::vector<std::string> DeleteThumbnails(const std::vector<std::string>& files);

}  // namespace fotomill::desktop
