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

// Previews for the overwrite prompt, made on the batch's thread.
struct OverwritePreview {
  RgbImage existing, incoming;
  std::string existingText, incomingText;  // one line each for size, dimensions and date
};

using OverwritePreviewMaker = std::function<OverwritePreview()>;

// The windows of a batch. Always called on the window's thread.
class BatchWindows {
 public:
  virtual ~BatchWindows() = default;
  // A batch starts; show an empty box.
  virtual void BatchOpened() = 0;
  // `outcome` belongs to the file of the line; empty for lines about the batch.
  virtual void BatchLine(const ProgressLine& line, const FileOutcome& outcome) = 0;
  // Shows which file is being processed.
  virtual void BatchStatus(const std::string& status) = 0;
  virtual void BatchWork(const ProgressWork& work) = 0;
  // The batch has ended: the box stays open, or closes.
  virtual void BatchStaysOpen(const ProgressModel& model) = 0;
  virtual void BatchCloses() = 0;
  // An output exists. The batch waits for the answer; until then, `makePreview` may be called on
  // any thread. It may take long.
  virtual OverwriteAnswer AskOverwrite(const OverwriteQuestion& question,
                                       const OverwritePreviewMaker& makePreview) = 0;
  virtual NameAnswer AskDestinationName(const NameQuestion& question) = 0;
  virtual std::optional<std::string> AskPassword(const std::string& path) = 0;  // nullopt: Cancel
  virtual bool ConfirmFormat(const std::string& question) = 0;
  // `yes`: label of the confirm button.
  virtual bool Confirm(const std::string& question, const std::string& yes) = 0;
  // Called last. MemoryAllocationError if the batch itself ran out of memory.
  virtual void BatchEnded(Status status, const BatchJob& job) = 0;
};

// Runs a batch in the background; reports and prompts go to the
// windows with `post`, which must run its argument on the window's
// thread, in order. The batch waits until a prompt is answered.
class BatchThread {
 public:
  using Post = std::function<void(std::function<void()>)>;

  // `windows` must outlive this object.
  BatchThread(BatchWindows& windows, Post post) : windows_(windows), post_(std::move(post)) {}
  // Stops a running batch, answers its prompts with no, and waits for it. `post` must not be
  // waiting for this.
  ~BatchThread();
  BatchThread(const BatchThread&) = delete;
  BatchThread& operator=(const BatchThread&) = delete;

  // Starts RunBatch; must not be called while
  // running. Sets `job.box` and `job.prompts`.
  void Start(std::vector<BatchFile> files, BatchFunction function, BatchJob job);
  // Any other work that reports to a box: `work`
  // receives the job, with box and prompts set.
  using Work = std::function<Status(BatchJob& job)>;
  void StartWork(BatchJob job, Work work);
  // Stops the batch after the current files.
  void Abort() { job_.stop.Stop(); }
  bool Running() const { return running_; }  // until BatchEnded

 private:
  class Box;
  class Questions;
  // Runs `action` on the window's thread and waits. False if the batch is being aborted.
  bool AskWindow(const std::function<void()>& action);
  void PostToWindows(std::function<void()> action) { post_(std::move(action)); }

  BatchWindows& windows_;
  const Post post_;
  BatchJob job_;
  std::mutex mutex_;
  std::condition_variable answered_;
  bool given_ = false;    // aborted
  bool running_ = false;  // window's thread only
  BackgroundTask task_;   // must be last: it uses the other members
};

// Previews of the existing file and of
// the new picture, which may be missing.
OverwritePreview MakeOverwritePreview(const OverwriteQuestion& question, int32_t side,
                                      const ThumbnailOptions& options);

}  // namespace fotomill::desktop
