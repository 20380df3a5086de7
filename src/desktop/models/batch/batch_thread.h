#pragma once

#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "batch/job.h"
#include "batch/progress_box.h"
#include "batch/prompts.h"
#include "batch/run.h"
#include "catalog/thumbnails/thumbnail_options.h"
#include "core/workers/background_task.h"
#include "desktop/models/drawing/rgb_image.h"

namespace fotomill::desktop {

// What the overwrite prompt shows beside its question, made where the batch runs.
struct OverwritePreview {
  RgbImage existing, incoming;
  std::string existingText, incomingText;  // size, dimensions and date of each, a line each
};

using OverwritePreviewMaker = std::function<OverwritePreview()>;

// What a batch tells and asks its windows. Every call comes on the window's thread.
class BatchWindows {
 public:
  virtual ~BatchWindows() = default;
  // A batch begins; its box comes up, empty.
  virtual void BatchOpened() = 0;
  // `outcome` is that of the file that the line is about, empty for lines about the batch.
  virtual void BatchLine(const ProgressLine& line, const FileOutcome& outcome) = 0;
  // The line that tells which file is in work.
  virtual void BatchStatus(const std::string& status) = 0;
  virtual void BatchWork(const ProgressWork& work) = 0;
  // The end: the box stays open to be read, or goes.
  virtual void BatchStaysOpen(const ProgressModel& model) = 0;
  virtual void BatchCloses() = 0;
  // The name of an output is taken. The batch waits for the answer. `makePreview` may be called on
  // any thread until then, and takes as long as it takes.
  virtual OverwriteAnswer AskOverwrite(const OverwriteQuestion& question,
                                       const OverwritePreviewMaker& makePreview) = 0;
  virtual NameAnswer AskDestinationName(const NameQuestion& question) = 0;
  virtual std::optional<std::string> AskPassword(const std::string& path) = 0;  // nullopt: Cancel
  virtual bool ConfirmFormat(const std::string& question) = 0;
  // `yes`: the text of the button that agrees.
  virtual bool Confirm(const std::string& question, const std::string& yes) = 0;
  // After everything else. MemoryAllocationError where the batch itself ran out of memory.
  virtual void BatchEnded(Status status, const BatchJob& job) = 0;
};

// Runs one batch apart; its reports and questions go to the windows by `post`, which has to run
// what it is given on the window's thread, in order. A question holds the batch until it is
// answered.
class BatchThread {
 public:
  using Post = std::function<void(std::function<void()>)>;

  // The windows must outlive it.
  BatchThread(BatchWindows& windows, Post post) : windows_(windows), post_(std::move(post)) {}
  // Asks a running batch to stop, answers its questions with no, and waits for it. `post` must not
  // be waiting for this.
  ~BatchThread();
  BatchThread(const BatchThread&) = delete;
  BatchThread& operator=(const BatchThread&) = delete;

  // Begins RunBatch with these; to be called when nothing runs. `job.box` and `job.prompts` are set
  // here.
  void Start(std::vector<BatchFile> files, BatchFunction function, BatchJob job);
  // Any other work that reports to a box: `work` gets the job, with box and prompts set, and
  // returns its status.
  using Work = std::function<Status(BatchJob& job)>;
  void StartWork(BatchJob job, Work work);
  // Asks the batch to stop; it finishes what is in work.
  void Abort() { job_.stop.Stop(); }
  bool Running() const { return running_; }  // until BatchEnded

 private:
  class Box;
  class Questions;
  // Runs `action` on the window's thread and waits for it. False when the batch is being given up.
  bool AskWindow(const std::function<void()>& action);
  void PostToWindows(std::function<void()> action) { post_(std::move(action)); }

  BatchWindows& windows_;
  const Post post_;
  BatchJob job_;
  std::mutex mutex_;
  std::condition_variable answered_;
  bool given_ = false;    // up
  bool running_ = false;  // belongs to the window's thread
  BackgroundTask task_;   // last: it uses the rest
};

// What the overwrite prompt shows of the file that is there and of the new picture, which may be
// missing.
OverwritePreview MakeOverwritePreview(const OverwriteQuestion& question, int32_t side,
                                      const ThumbnailOptions& options);

}  // namespace fotomill::desktop
