#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "batch/progress_model.h"

namespace fotomill {

struct BatchJob;
struct FileOutcome;

// The progress of a batch; files may finish in any order: `done` of `count` are.
struct ProgressWork {
  uint32_t done = 0, count = 0;
  uint32_t inWork = 0;
  std::string file;  // running for the longest time; may be empty
};

// Receives the progress of a batch; implemented by front ends. Called on the thread that runs the
// batch, which waits for the call to return: windows must copy data to their own thread. Arguments
// are valid only during the call.
class ProgressBox {
 public:
  virtual ~ProgressBox() = default;
  // A batch starts; the model is empty. Return false
  // if no box can be shown, to cancel the batch.
  virtual bool Open(const ProgressModel& model) = 0;
  // A line was added to the list; `outcome` is null for lines that are not about a file.
  virtual void ShowLine(const ProgressLine& line, const FileOutcome* outcome) = 0;
  virtual void ShowStatus(const std::string& status) = 0;  // replaces the status line
  // `done` of `count` files are finished.
  virtual void ShowProgress(uint32_t done, uint32_t count) { (void)done, (void)count; }
  // The current work: when the batch starts, and several times a second while it waits.
  virtual void ShowWork(const ProgressWork& work) { (void)work; }
  // Called several times a second while the batch waits, to update times.
  virtual void Tick() {}
  // Returns false to end the batch like Abort, if output is no longer possible.
  virtual bool GoesOn() { return true; }
  // The batch has ended and the box stays open: the list is rebuilt with a vertical scroll bar,
  // with the item and row height of every line, the same first visible line, and the last line
  // selected; Close is enabled, Abort is not.
  virtual void StayOpen(const ProgressModel& model) = 0;
  // The batch has ended and the box closes.
  virtual void Close(const ProgressModel& model) = 0;
};

// Opens the job's box, clears its list and the job's error flag. False if the box cannot be shown.
// A job without a box still collects its lines.
bool OpenProgressBox(BatchJob& job);
// Adds `text` as a new line and sets the status line to "Processing file %d of %d" with index + 1
// and count.
void ReportFile(BatchJob& job, std::string_view text, uint32_t index, uint32_t count);
// The same with the outcome of the file. The text is FileLine(outcome); failures set the job's
// error flag.
void ReportOutcome(BatchJob& job, const FileOutcome& outcome, uint32_t index, uint32_t count);
// Sets the job's status line, also in its box, if any.
void SetStatus(BatchJob& job, std::string_view text);
// Adds the closing lines and closes the box, or
// leaves it open, depending on CloseProgressWhenDone.
void FinishProgress(BatchJob& job);

// A list line: "SOURCE -> DESTINATION", followed by ": NOTE" if there is one, or "SOURCE: MESSAGE"
// followed by the hint.
std::string FileLine(const FileOutcome& outcome);

}  // namespace fotomill
