#include "desktop/models/batch/batch_thread.h"

#include <algorithm>

#include "batch/new_job.h"
#include "core/choice_lists.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/thumbnails/thumbnail.h"
#include "platform/files.h"
#include "processing/geometry/scale.h"
#include "settings/job_options.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int32_t kPreviewSide = 200;

std::string DimensionsText(int32_t width, int32_t height, int32_t bits) {
  return Tr("%1 x %2, %3 bits", width, height, bits);
}

// A copy of a picture owned by another thread, scaled to a square.
RgbImage SmallCopy(const PictureRecord& picture, int32_t side, Color matte) {
  PackedImage scaled, alpha;
  RgbImage rgb;
  const Size size = FitSize(picture.image.Width(), picture.image.Height(), side);
  if (ScaleFiltered(picture.image, picture.alpha, size, ScaleFilter::Bilinear, scaled, alpha) !=
      Status::Ok)
    return rgb;
  PictureRecord small;
  small.width = scaled.Width();
  small.height = scaled.Height();
  small.bitsPerPixel = scaled.Bits();
  small.image = std::move(scaled);
  small.alpha = std::move(alpha);
  if (PrepareForDisplay(small, matte) == Status::Ok) (void)ToRgb(small.image, rgb);
  return rgb;
}

}  // namespace

OverwritePreview MakeOverwritePreview(const OverwriteQuestion& question, int32_t side,
                                      const ThumbnailOptions& options) {
  OverwritePreview preview;
  const platform::FileFacts there = platform::FactsOf(question.path);
  const ThumbnailPointer existing = LoadThumbnail(
      {question.path, there.modified, there.size, side, choice::kVirtual, false, options});
  preview.existing = existing->pixels;
  preview.existingText =
      SizeText(there.size, choice::kSizeFitting) + "\n" + DateText(there.modified);
  if (existing->width > 0)
    preview.existingText.append("\n").append(
        DimensionsText(existing->width, existing->height, existing->bits));
  if (question.picture == nullptr) return preview;
  const PictureRecord& incoming = *question.picture;
  if (!incoming.image.Empty()) preview.incoming = SmallCopy(incoming, side, options.matte);
  const platform::FileFacts source = platform::FactsOf(question.source);
  preview.incomingText.append(Tr("From %1", SizeText(source.size, choice::kSizeFitting)))
      .append("\n");
  preview.incomingText.append(DateText(source.modified)).append("\n");
  preview.incomingText += DimensionsText(incoming.width, incoming.height, incoming.bitsPerPixel);
  return preview;
}

// Progress box on the batch's thread.
class BatchThread::Box : public ProgressBox {
 public:
  explicit Box(BatchThread& batch) : batch_(batch) {}
  bool Open(const ProgressModel&) override {
    batch_.PostToWindows([&windows = batch_.windows_] { windows.BatchOpened(); });
    return true;
  }
  void ShowLine(const ProgressLine& line, const FileOutcome* outcome) override {
    batch_.PostToWindows(
        [&windows = batch_.windows_, line, copy = outcome == nullptr ? FileOutcome() : *outcome] {
          windows.BatchLine(line, copy);
        });
  }
  void ShowStatus(const std::string& status) override {
    batch_.PostToWindows([&windows = batch_.windows_, status] { windows.BatchStatus(status); });
  }
  void ShowWork(const ProgressWork& work) override {
    work_ = work;
    batch_.PostToWindows([&windows = batch_.windows_, work] { windows.BatchWork(work); });
  }
  // Never decreases progress; batches that do not report their work only call this.
  void ShowProgress(uint32_t done, uint32_t count) override {
    work_.done = std::max(work_.done, done);
    work_.count = count;
    ShowWork(work_);
  }
  void StayOpen(const ProgressModel& model) override {
    batch_.PostToWindows([&windows = batch_.windows_, model] { windows.BatchStaysOpen(model); });
  }
  void Close(const ProgressModel&) override {
    batch_.PostToWindows([&windows = batch_.windows_] { windows.BatchCloses(); });
  }

 private:
  BatchThread& batch_;
  ProgressWork work_;
};

// Prompts on the batch's thread.
class BatchThread::Questions : public Prompts {
 public:
  Questions(BatchThread& batch, const ThumbnailOptions& thumbnails)
      : batch_(batch), thumbnails_(thumbnails) {}
  OverwriteAnswer AskOverwrite(const OverwriteQuestion& question) override {
    const auto make = [&] { return MakeOverwritePreview(question, kPreviewSide, thumbnails_); };
    // enabled previews are made here; if enabled later, by the window
    OverwritePreview preview;
    if (question.checks.previews) preview = make();
    const OverwritePreviewMaker maker =
        question.checks.previews ? OverwritePreviewMaker([&] { return preview; }) : make;
    OverwriteAnswer answer;
    if (!batch_.AskWindow([&] { answer = batch_.windows_.AskOverwrite(question, maker); }))
      answer.skipRest = true;
    return answer;
  }
  NameAnswer AskDestinationName(const NameQuestion& question) override {
    NameAnswer answer;
    (void)batch_.AskWindow([&] { answer = batch_.windows_.AskDestinationName(question); });
    return answer;
  }
  std::optional<std::string> AskPassword(const std::string& path) override {
    std::optional<std::string> answer;
    (void)batch_.AskWindow([&] { answer = batch_.windows_.AskPassword(path); });
    return answer;
  }
  bool ConfirmFormat(const std::string& question) override {
    bool confirmed = false;
    (void)batch_.AskWindow([&] { confirmed = batch_.windows_.ConfirmFormat(question); });
    return confirmed;
  }
  bool ConfirmNewFolder(const std::string& folder) override {
    return Confirm(Tr("Folder \"%1\" does not exist. Create it?", folder), Tr("&Create"));
  }

 private:
  bool Confirm(const std::string& question, const std::string& yes) {
    bool confirmed = false;
    (void)batch_.AskWindow([&] { confirmed = batch_.windows_.Confirm(question, yes); });
    return confirmed;
  }

  BatchThread& batch_;
  const ThumbnailOptions thumbnails_;
};

BatchThread::~BatchThread() {
  if (!task_.Running()) return;
  job_.stop.Stop();
  {
    const std::lock_guard lock(mutex_);
    given_ = true;
  }
  answered_.notify_all();
}

void BatchThread::Start(std::vector<BatchFile> files, BatchFunction function, BatchJob job) {
  StartWork(std::move(job), [files = std::move(files), function = std::move(function)](
                                BatchJob& running) { return RunBatch(files, function, running); });
}

void BatchThread::StartWork(BatchJob job, Work work) {
  task_.Wait();
  job_ = std::move(job);
  // Settings belong to the window's thread.
  job_.remember = [this](Remembered what, int32_t value) {
    PostToWindows([what, value] { StoreRemembered(what, value); });
  };
  running_ = true;
  const auto run = [this, work = std::move(work),
                    thumbnails = ThumbnailOptionsFromSettings()](const StopToken&) {
    Box box(*this);
    Questions questions(*this, thumbnails);
    job_.box = &box;
    job_.prompts = &questions;
    return work(job_);
  };
  task_.Start(Lane::Blocking, run, [this](Status status) {
    job_.box = nullptr;
    job_.prompts = nullptr;
    PostToWindows([this, status] {
      running_ = false;
      windows_.BatchEnded(status, job_);
    });
  });
}

bool BatchThread::AskWindow(const std::function<void()>& action) {
  // Shared with the window's thread, which may run it after the batch was aborted.
  struct Turn {
    std::mutex mutex;
    bool done = false;
    bool dropped = false;
  };
  auto turn = std::make_shared<Turn>();
  PostToWindows([this, turn, action] {
    {
      const std::lock_guard lock(turn->mutex);
      if (turn->dropped) return;
      action();
      turn->done = true;
    }
    const std::lock_guard lock(mutex_);
    answered_.notify_all();
  });
  std::unique_lock lock(mutex_);
  while (true) {
    {
      const std::unique_lock turnLock(turn->mutex, std::try_to_lock);
      if (turnLock.owns_lock() && turn->done) return true;
      if (turnLock.owns_lock() && given_) {
        turn->dropped = true;
        return false;
      }
    }
    answered_.wait_for(lock, std::chrono::milliseconds(100));
  }
}

}  // namespace fotomill::desktop
