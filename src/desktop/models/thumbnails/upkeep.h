#pragma once

#include <atomic>
#include <cstdint>
#include <string>
#include <vector>

#include "catalog/thumbnails/thumbnail_database.h"
#include "core/progress.h"
#include "core/workers/background_task.h"

namespace fotomill::desktop {

// Compaction of one thumbnail database on a thread of its own, for a window that shows how far it
// is.
class DatabaseCompaction : private ProgressSink {
 public:
  // Begins at once; `purge` drops the thumbnails of missing pictures as well; with `hidden` the
  // new file is hidden.
  DatabaseCompaction(std::string path, bool purge, bool hidden);
  // Stops it and waits; the database is then as it was, unless it was done.
  ~DatabaseCompaction() override = default;
  DatabaseCompaction(const DatabaseCompaction&) = delete;
  DatabaseCompaction& operator=(const DatabaseCompaction&) = delete;

  // Asks it to stop, whether it has ended either way, and how many records it has dealt with.
  void Stop() { task_.Stop(); }
  bool Ended() const { return ended_; }
  int32_t Done() const { return done_; }
  int32_t Total() const { return total_; }  // records, 0 until it is known

  // What became of it, once it has ended: a sentence or two for people.
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
  BackgroundTask task_;  // last: it uses the rest
};

// "1,234 records, 35.1 MB", or why there is nothing to compact.
std::string DescribeDatabase(const std::string& path);

// Thumbnail files of a folder, and with `below` of the folders below it, whose pictures are gone.
// Folders on optical drives and those that cannot be read give none. Ends early when `stop` is
// asked.
std::vector<std::string> FindOrphanThumbnails(const std::string& folder, bool below,
                                              const StopToken& stop);
// Deletes them; those that could not be deleted come back.
std::vector<std::string> DeleteThumbnails(const std::vector<std::string>& files);

}  // namespace fotomill::desktop
