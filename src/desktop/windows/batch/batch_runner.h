#pragma once

#include <wx/event.h>

#include <deque>
#include <memory>
#include <string>
#include <vector>

#include "desktop/models/batch/batch_thread.h"
#include "files/file_operation.h"
#include "processing/geometry/orient.h"

namespace fotomill {
class PreviousFiles;
}

namespace fotomill::desktop {

class Shell;
class ProgressWindow;

// Runs the batches of a frame in sequence, with progress box and prompts.
class BatchRunner : public wxEvtHandler, public BatchWindows {
 public:
  explicit BatchRunner(Shell& shell);
  ~BatchRunner() override;

  // Starts a batch, or queues it.
  void Run(std::vector<BatchFile> files, BatchFunction function, BatchJob job);
  // `previous`: keeps the files that the batch replaces, if any.
  void Run(BatchJob job, BatchThread::Work work, std::shared_ptr<PreviousFiles> previous = nullptr);
  bool Running() const { return thread_->Running(); }  // one batch at a time

 private:
  struct Waiting {
    BatchJob job;
    BatchThread::Work work;
    std::shared_ptr<PreviousFiles> previous;
    bool converts = false;  // writes outputs
  };
  void Run(Waiting waiting);
  void StartNext();
  void ReportWaiting();
  void LeaveBox();
  void CloseBox();

  void BatchOpened() override;
  void BatchLine(const ProgressLine& line, const FileOutcome& outcome) override;
  void BatchStatus(const std::string& status) override;
  void BatchWork(const ProgressWork& work) override;
  void BatchStaysOpen(const ProgressModel& model) override;
  void BatchCloses() override;
  OverwriteAnswer AskOverwrite(const OverwriteQuestion& question,
                               const OverwritePreviewMaker& makePreview) override;
  NameAnswer AskDestinationName(const NameQuestion& question) override;
  std::optional<std::string> AskPassword(const std::string& path) override;
  bool ConfirmFormat(const std::string& question) override;
  bool Confirm(const std::string& question, const std::string& yes) override;
  void BatchEnded(Status status, const BatchJob& job) override;
  void RaiseProgram();
  wxWindow* DialogParent() const;

  Shell& shell_;
  std::deque<Waiting> waiting_;
  ProgressWindow* box_ = nullptr;            // of the current or last batch
  bool converts_ = false;                    // the current batch writes outputs
  bool seen_ = false;                        // the user saw its end
  size_t failed_ = 0;                        // in the current batch
  std::shared_ptr<PreviousFiles> previous_;  // of the current batch
  // files of the current batch that can be undone
  FileOperation written_;
  std::unique_ptr<BatchThread> thread_;
};

// Turns the pictures in the frame's selected files.
void TurnSelection(Shell& shell, Orientation turn);

// The function Convert: asks for the destination and runs the batch on the frame's selection.
void ConvertSelection(Shell& shell);
// The function Resize: the same, to one of the sizes in the settings.
void ResizeSelection(Shell& shell);

}  // namespace fotomill::desktop
