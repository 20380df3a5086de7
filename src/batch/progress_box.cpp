#include "batch/progress_box.h"

#include "batch/job.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

void AddLine(BatchJob& job, ProgressLine line, const FileOutcome* outcome) {
  job.progress.AddLine(std::move(line));
  if (job.box != nullptr) job.box->ShowLine(job.progress.Lines().back(), outcome);
}

void ShowPlace(BatchJob& job, uint32_t index, uint32_t count) {
  SetStatus(job, Tr("Processing file %1 of %2", index + 1, count));
  if (job.box != nullptr) job.box->ShowProgress(index + 1, count);
}

}  // namespace

bool OpenProgressBox(BatchJob& job) {
  job.errors = false;
  job.progress.Open();
  if (job.box == nullptr || job.box->Open(job.progress)) return true;
  job.progress.Close();
  return false;
}

void ReportFile(BatchJob& job, std::string_view text, uint32_t index, uint32_t count) {
  AddLine(job, {std::string(text), {.file = static_cast<int32_t>(index)}}, nullptr);
  ShowPlace(job, index, count);
}

void ReportOutcome(BatchJob& job, const FileOutcome& outcome, uint32_t index, uint32_t count) {
  if (outcome.status != Status::Ok && !outcome.skipped) job.errors = true;
  AddLine(job, {FileLine(outcome), {static_cast<int32_t>(index), outcome.status, outcome.skipped}},
          &outcome);
  ShowPlace(job, index, count);
}

void SetStatus(BatchJob& job, std::string_view text) {
  job.progress.SetStatus(text);
  if (job.box != nullptr) job.box->ShowStatus(job.progress.StatusText());
}

void FinishProgress(BatchJob& job) {
  const size_t first = job.progress.Lines().size();
  job.progress.Finish(job.errors, !job.noSummary, job.boxSettings);
  if (job.box == nullptr) return;
  for (size_t i = first; i < job.progress.Lines().size(); ++i)
    job.box->ShowLine(job.progress.Lines()[i], nullptr);
  if (job.progress.IsOpen()) {
    job.box->StayOpen(job.progress);
  } else {
    job.box->Close(job.progress);
  }
}

std::string FileLine(const FileOutcome& outcome) {
  if (outcome.status == Status::Ok && !outcome.skipped) {
    const std::string line = outcome.source + " -> " + outcome.destination;
    return outcome.note.empty() ? line : line + ": " + outcome.note.shown;
  }
  std::string line = outcome.source + ": ";
  if (!outcome.skipped) line += StatusText(outcome.status);
  if (!outcome.hint.empty()) line += (outcome.skipped ? "" : " ") + outcome.hint;
  return line;
}

}  // namespace fotomill
