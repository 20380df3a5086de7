#include "desktop/windows/batch/batch_runner.h"

#include <wx/msgdlg.h>
#include <wx/textdlg.h>

#include "batch/new_job.h"
#include "batch/rewrite/turn_run.h"
#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/batch/destination_dialog.h"
#include "desktop/windows/batch/name_dialog.h"
#include "desktop/windows/batch/notification.h"
#include "desktop/windows/batch/overwrite_dialog.h"
#include "desktop/windows/batch/progress_window.h"
#include "desktop/windows/batch/prompt_for_destination.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "files/previous_file.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

BatchRunner::BatchRunner(Shell& shell) : shell_(shell) {
  thread_ = std::make_unique<BatchThread>(*this, [this](std::function<void()> action) {
    CallAfter([action = std::move(action)] { action(); });
  });
}

BatchRunner::~BatchRunner() { thread_.reset(); }

void BatchRunner::Run(std::vector<BatchFile> files, BatchFunction function, BatchJob job) {
  const auto run = [files = std::move(files), function = std::move(function)](BatchJob& running) {
    return RunBatch(files, function, running);
  };
  Run({std::move(job), run, nullptr, true});
}

void BatchRunner::Run(BatchJob job, BatchThread::Work work,
                      std::shared_ptr<PreviousFiles> previous) {
  Run({std::move(job), std::move(work), std::move(previous)});
}

void BatchRunner::Run(Waiting waiting) {
  waiting_.push_back(std::move(waiting));
  if (!Running()) {
    StartNext();
  } else {
    shell_.Report(Tr("The batch starts when the previous one has finished."));
    ReportWaiting();
  }
}

void BatchRunner::ReportWaiting() {
  LogEvent("batch", "waiting=" + std::to_string(waiting_.size()));
  if (box_ != nullptr) box_->SetWaiting(waiting_.size());
}

void BatchRunner::StartNext() {
  if (waiting_.empty()) return;
  LeaveBox();
  written_ = {FileOperationKind::Create, {}};
  failed_ = 0;
  Waiting next = std::move(waiting_.front());
  waiting_.pop_front();
  previous_ = std::move(next.previous);
  converts_ = next.converts;
  thread_->StartWork(std::move(next.job), std::move(next.work));
}

// A box that stays open is left alone by later batches; any other is replaced.
void BatchRunner::LeaveBox() {
  if (box_ != nullptr && box_->StaysOpen()) box_ = nullptr;
  CloseBox();
}

void BatchRunner::CloseBox() {
  if (box_ != nullptr) std::exchange(box_, nullptr)->Destroy();
}

wxWindow* BatchRunner::DialogParent() const {
  return box_ != nullptr ? static_cast<wxWindow*>(box_) : &shell_.Window();
}

// --- the progress box ---

void BatchRunner::BatchOpened() {
  ProgressWindow::Events events;
  events.abort = [this] { thread_->Abort(); };
  events.closed = [this](ProgressWindow& box) {
    if (box_ == &box) box_ = nullptr;
    box.Destroy();
  };
  events.selectFailed = [this](const std::vector<std::string>& files) {
    shell_.Tabs().SelectFiles(files);
  };
  LeaveBox();
  box_ = new ProgressWindow(&shell_.Window(), shell_.Thumbnails(), events);
  // do not take the focus from another program
  if (InFront()) {
    box_->Show();
  } else {
    box_->ShowWithoutActivating();
  }
  ReportWaiting();
  LogEvent("batch", "opened");
}

void BatchRunner::BatchLine(const ProgressLine& line, const FileOutcome& outcome) {
  LogEvent("batch-line", line.text);
  failed_ += line.item.file >= 0 && outcome.status != Status::Ok && !outcome.skipped;
  if (box_ != nullptr) box_->AddLine(line, outcome.source);
  const bool written = outcome.status == Status::Ok && !outcome.skipped && !outcome.replaced &&
                       !outcome.destination.empty();
  if (written)
    written_.steps.push_back({outcome.source, platform::AbsolutePath(outcome.destination)});
}

void BatchRunner::BatchStatus(const std::string& status) {
  if (box_ != nullptr) box_->SetStatus(status);
}

void BatchRunner::BatchWork(const ProgressWork& work) {
  if (box_ != nullptr) box_->SetWork(work);
}

// Check whether the user saw the end before the box takes the focus.
void BatchRunner::BatchStaysOpen(const ProgressModel& model) {
  seen_ = InFront();
  LogEvent("batch", "stays-open files=" + std::to_string(model.Files()));
  if (box_ != nullptr) box_->StayOpen(model.StatusText());
}

void BatchRunner::BatchCloses() {
  seen_ = InFront();
  LogEvent("batch", "closes");
  CloseBox();
}

void BatchRunner::BatchEnded(Status status, const BatchJob& job) {
  LogEvent("batch", "ended status=" + std::to_string(StatusNumber(status)));
  shell_.Uses().Note(job.uses);
  // Outputs, but not renamed files.
  if (converts_ || previous_ != nullptr) shell_.Files().NoteDone(std::exchange(written_, {}));
  if (previous_ != nullptr) shell_.Files().NoteDone(std::exchange(previous_, nullptr)->Operation());
  if (job.filesChanged) shell_.FilesChanged();
  if (!seen_ && settings.ProgressRaiseAppWindow != 0) RaiseProgram();
  if (!seen_)
    NotifyUser(shell_.Window(),
               failed_ == 0 ? Label("Batch finished") : Label("Batch finished with errors"),
               Shown(CountLine(job.progress.Files())));
  if (status == Status::Ok) shell_.Report(CountLine(job.progress.Files()));
  CallAfter([this] { StartNext(); });
}

// The user is in another program: raises the relevant window.
void BatchRunner::RaiseProgram() {
  wxTopLevelWindow* const window = box_ != nullptr && box_->StaysOpen()
                                       ? static_cast<wxTopLevelWindow*>(box_)
                                       : &shell_.Window();
  if (window->IsIconized()) window->Iconize(false);
  window->Raise();
  LogEvent("batch", "raised");
}

// --- prompts ---

OverwriteAnswer BatchRunner::AskOverwrite(const OverwriteQuestion& question,
                                          const OverwritePreviewMaker& makePreview) {
  OverwriteDialog dialog(DialogParent(), question, makePreview);
  LogEvent("prompt", "overwrite " + question.path);
  dialog.ShowModal();
  return dialog.Answer();
}

NameAnswer BatchRunner::AskDestinationName(const NameQuestion& question) {
  NameDialog dialog(DialogParent(), question);
  LogEvent("prompt", "name " + question.path);
  dialog.ShowModal();
  if (dialog.Aborts()) thread_->Abort();
  return dialog.Answer();
}

std::optional<std::string> BatchRunner::AskPassword(const std::string& path) {
  wxTextEntryDialog dialog(DialogParent(),
                           Label("Password for %1:", Shown(platform::FileNameOf(path))),
                           Label("Password"), "",
                           wxTextEntryDialogStyle |
                               (settings.ArchiveMaskPassword != 0 ? wxTE_PASSWORD : 0));
  LogEvent("prompt", "password " + path);
  if (dialog.ShowModal() != wxID_OK) return std::nullopt;
  return Utf8(dialog.GetValue());
}

bool BatchRunner::ConfirmFormat(const std::string& question) {
  LogEvent("prompt", "format " + question);
  return PromptForDestination(*DialogParent(), question);
}

bool BatchRunner::Confirm(const std::string& question, const std::string& yes) {
  wxMessageDialog dialog(DialogParent(), Shown(question), "Fotomill Professional",
                         wxOK | wxCANCEL | wxICON_QUESTION);
  dialog.SetOKLabel(Shown(yes));
  LogEvent("prompt", "confirm " + question);
  return dialog.ShowModal() == wxID_OK;
}

void TurnSelection(Shell& shell, Orientation turn) {
  std::vector<BatchFile> files;
  if (RefusesChange(&shell.Window(), shell.Tabs().SelectedFiles())) return;
  for (const std::string& file : shell.Tabs().SelectedFiles())
    files.push_back({.name = file, .below = {}, .hint = {}});
  if (files.empty()) return;
  auto previous = std::make_shared<PreviousFiles>();
  TurnFunction function{
      .request = {.turn = turn, .seenByExif = settings.ExifAdjustOrientation != 0},
      .inPlace = true};
  function.keepPrevious = [previous](const std::string& path) { return previous->Keep(path); };
  function.replaced = [previous](const std::string& path) { previous->Replaced(path); };
  shell.Batches().Run(
      NewBatchJob(), [files, function](BatchJob& job) { return RunTurn(files, function, job); },
      previous);
}

namespace {

// Asks for the destination and runs the batch on the frame's selection.
void RunWithDestination(Shell& shell, const wxString& verb, bool resizes) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (files.empty()) return;
  DestinationDialog dialog(&shell.Window(), verb, files, resizes);
  LogEvent("prompt", "destination");
  if (dialog.ShowModal() != wxID_OK) return;
  const DestinationChoice choice = dialog.Choice();
  std::vector<BatchFile> batch;
  for (const std::string& file : files) batch.push_back({.name = file, .below = {}, .hint = {}});
  BatchJob job = JobFor(choice);
  BatchFunction function = FunctionFor(choice, job);
  shell.Batches().Run(std::move(batch), std::move(function), std::move(job));
}

}  // namespace

void ConvertSelection(Shell& shell) { RunWithDestination(shell, Label("Convert"), false); }

void ResizeSelection(Shell& shell) {
  if (NamedSizes().empty()) {
    wxMessageBox(Label("No size is set. Enter one as WIDTH,HEIGHT in Setup."), Label("Resize"),
                 wxOK | wxICON_INFORMATION, &shell.Window());
    return;
  }
  RunWithDestination(shell, Label("Resize"), true);
}

}  // namespace fotomill::desktop
