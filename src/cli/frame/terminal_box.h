#pragma once

#include "batch/job.h"
#include "cli/frame/result_output.h"

namespace fotomill::cli {

// The progress box of the command line: results and messages as every command prints them.
class TerminalBox : public ProgressBox {
 public:
  // `verbose` also prints notes that are not failures, `tellReplaced` also which files were
  // replaced.
  TerminalBox(ResultOutput& output, bool verbose, bool tellReplaced)
      : output_(output), verbose_(verbose), tellReplaced_(tellReplaced) {
    output_.KeepGoing();
  }

  bool Open(const ProgressModel&) override { return true; }
  void ShowLine(const ProgressLine& line, const FileOutcome* outcome) override;
  void ShowStatus(const std::string&) override {}
  void ShowProgress(uint32_t done, uint32_t count) override { output_.ShowProgress(done, count); }
  void Tick() override { output_.Tick(); }
  bool GoesOn() override { return output_.GoesOn(); }
  void StayOpen(const ProgressModel&) override {}
  void Close(const ProgressModel&) override {}

 private:
  void ShowElement(const FileOutcome& outcome);

  ResultOutput& output_;
  bool toldFailures_ = false;
  const bool verbose_;
  const bool tellReplaced_;
};

// Records a batch in the file history, unless --no-history is given. Returns the exit status of its
// command: kExitFailed if a file failed or got no name.
int FinishBatch(const BatchJob& job, const CommandContext& context);

}  // namespace fotomill::cli
