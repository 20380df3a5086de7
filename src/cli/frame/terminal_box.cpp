#include "cli/frame/terminal_box.h"
#include "settings/job_options.h"

#include "texts/texts.h"

namespace fotomill::cli {

void TerminalBox::ShowLine(const ProgressLine& line, const FileOutcome* outcome) {
  if (outcome == nullptr) {  // summary line
    output_.EndArray();
    if (output_.Failures() > 0 && !toldFailures_)
      output_.Note(TrCount("One file failed.", "%1 files failed.", output_.Failures()));
    toldFailures_ = true;
    return output_.Note(line.text);
  }
  const std::string name = output_.ShownMessage(outcome->source) + ": ";
  if (output_.IsJson()) ShowElement(*outcome);
  if (outcome->skipped) {
    const std::string text = name + output_.ShownMessage(outcome->hint);
    return outcome->status == Status::Ok ? output_.Note(text) : output_.Message(text);
  }
  if (outcome->status != Status::Ok)
    return output_.Failure(outcome->source, outcome->status, outcome->hint);
  if (!output_.IsJson())
    output_.Line(output_.Shown(outcome->source) + " -> " + output_.Shown(outcome->destination));
  if (tellReplaced_ && outcome->replaced)
    output_.Note(name + Tr("replaced %1.", output_.ShownMessage(outcome->destination)));
  if (!outcome->note.empty()) output_.Note(name + outcome->note.shown);
  if (verbose_ && !outcome->detail.empty()) output_.Note(name + outcome->detail.shown);
}

void TerminalBox::ShowElement(const FileOutcome& outcome) {
  Json element;
  PutName(element, "file", output_.NameOf(outcome.source));
  PutName(element, "destination",
          outcome.status == Status::Ok ? output_.NameOf(outcome.destination) : std::string_view());
  if (!outcome.output.empty()) element["output"] = outcome.output;
  PutStatus(element, outcome.status);
  if (outcome.skipped) element["skipped"] = true;
  if (!outcome.note.empty()) element["note"] = outcome.note.english;
  if (!outcome.detail.empty()) element["detail"] = outcome.detail.english;
  output_.Element(element);
}

int FinishBatch(const BatchJob& job, const CommandContext& context) {
  // errors writing the history are ignored
  if (!job.uses.empty() && !context.global.noHistory)
    (void)UpdateFileHistory(HistoryOptionsFromSettings(), job.uses);
  return job.errors || job.writeAborts > 0 ? kExitFailed : kExitOk;
}

}  // namespace fotomill::cli
