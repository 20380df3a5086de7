#pragma once

#include "batch/job.h"
#include "cli/frame/result_output.h"

namespace fotomill::cli {

// Progress box of the command line: prints results and messages via ResultOutput.
class TerminalBox : public ProgressBox {
 public:
  // `verbose` also prints notes, `tellReplaced`
  // also the names of replaced files.
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

// Records a batch in the file history, unless --no-history is given. Returns the exit status:
// kExitFailed if a file failed or could not be named.
int FinishBatch(const BatchJob& job, const CommandContext& context);

}  // namespace fotomill::cli
