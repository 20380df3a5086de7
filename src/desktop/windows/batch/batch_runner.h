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

// Runs batches for a frame, one after the other, with their progress box and prompts.
class BatchRunner : public wxEvtHandler, public BatchWindows {
 public:
  explicit BatchRunner(Shell& shell);
  ~BatchRunner() override;

  // Begins a batch, or has it wait for those before.
  void Run(std::vector<BatchFile> files, BatchFunction function, BatchJob job);
  // With the files that the batch will replace, where it keeps them.
  void Run(BatchJob job, BatchThread::Work work, std::shared_ptr<PreviousFiles> previous = nullptr);
  bool Running() const { return thread_->Running(); }  // one batch at a time

 private:
  struct Waiting {
    BatchJob job;
    BatchThread::Work work;
    std::shared_ptr<PreviousFiles> previous;
  };
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
  ProgressWindow* box_ = nullptr;            // of the batch that runs or was the last
  bool seen_ = false;                        // its end, by the user
  size_t failed_ = 0;                        // files of the batch that runs
  std::shared_ptr<PreviousFiles> previous_;  // of the batch that runs
  // by the batch that runs, as far as it can be taken back
  FileOperation written_;
  std::unique_ptr<BatchThread> thread_;
};

// Turns the frame's selection in its files.
void TurnSelection(Shell& shell, Orientation turn);

// The function Convert: asks for the destination and runs the batch over the frame's selection.
void ConvertSelection(Shell& shell);
// The function Resize: the same, to one of the sizes of the settings.
void ResizeSelection(Shell& shell);

}  // namespace fotomill::desktop
