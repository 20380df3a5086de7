#include "desktop/models/pages/page_work.h"

#include <string_view>
#include <utility>

#include "batch/progress_box.h"
#include "platform/clock.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "printing/page_failure.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

PageRunHost HostOf(BatchJob& job) {
  const auto progress = [&job](size_t done, size_t total) {
    SetStatus(job, Tr("Processing file %1 of %2", done, total));
    if (job.box != nullptr)
      job.box->ShowProgress(static_cast<uint32_t>(done), static_cast<uint32_t>(total));
  };
  const auto tick = [&job] {
    if (job.box != nullptr) job.box->Tick();
  };
  return {.progress = progress,
          .goesOn = [stop = job.stop.Token()] { return !stop.Asked(); },
          .tick = tick};
}

void NoteUse(BatchJob& job, const std::string& file, FileFunction function) {
  job.uses.push_back({platform::AbsolutePath(file), function, kOwnTime,
                      static_cast<int32_t>(platform::Now()), false});
}

}  // namespace

std::vector<BatchFile> FilesOf(const std::vector<std::string>& paths) {
  std::vector<BatchFile> files;
  for (const std::string& path : paths) files.push_back({.name = path, .below = {}, .hint = {}});
  return files;
}

std::vector<std::string> ProblemLines(std::span<const BatchFile> files,
                                      std::span<const PageOutcome> outcomes) {
  std::vector<std::string> lines;
  for (size_t i = 0; i < outcomes.size(); ++i) {
    const PageOutcome& outcome = outcomes[i];
    if (outcome.status == Status::Ok) continue;
    std::string line(platform::FileNameOf(files[i].name));
    line.append(": ").append(StatusText(outcome.status));
    if (!outcome.hint.empty()) line.append(" ").append(outcome.hint);
    lines.push_back(std::move(line));
  }
  return lines;
}

FileFunction HistoryFunctionOf(const PageKind& kind) {
  const std::string_view name = kind.name;
  if (name == "contact") return FileFunction::ContactSheet;
  if (name == "catalog") return FileFunction::Catalog;
  if (name == "gallery") return FileFunction::WebGallery;
  return name == "photo" ? FileFunction::PhotoWorkshop : FileFunction::Print;
}

Status WritePagesPdf(std::span<const BatchFile> files, const PagePlan& plan, FileFunction function,
                     const std::string& path, BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  PageRun run(files, plan.run, HostOf(job));
  Status status = Status::FunctionCancelled;
  if (run.Open())
    status = run.Pages().empty() ? Status::Ok : run.WritePdf(path, platform::Existing::Replace);
  const std::string reason = PageFailureHint(status, path);
  const auto count = static_cast<uint32_t>(files.size());
  for (uint32_t i = 0; i < count; ++i) {
    const PageOutcome& outcome = run.Outcomes()[i];
    FileOutcome file{.source = files[i].name,
                     .destination = path,
                     .status = outcome.status,
                     .hint = outcome.hint};
    if (file.status == Status::Ok && status != Status::Ok) continue;
    if (file.status == Status::Ok && outcome.page == 0) {
      file.status = Status::UnsuitableImage;
      file.hint = plan.leftOut;
    }
    if (file.status == Status::Ok) NoteUse(job, file.source, function);
    ReportOutcome(job, file, i, count);
  }
  if (status == Status::Ok) {
    job.filesChanged = !run.Pages().empty();
  } else if (status != Status::FunctionCancelled) {
    ReportOutcome(job, {.source = path, .status = status, .hint = reason}, count - 1, count);
  }
  FinishProgress(job);
  return status;
}

Status WriteGallery(std::vector<BatchFile> files, const GalleryOptions& gallery, BatchJob& job) {
  if (!OpenProgressBox(job)) return Status::FunctionCancelled;
  LeaveOutRepeated(gallery.folder, files);
  const PageRunHost host = HostOf(job);
  std::vector<GalleryOutcome> outcomes;
  std::string failed;
  const auto count = static_cast<uint32_t>(files.size());
  const Status status =
      BuildGallery(files, gallery,
                   {.progress = host.progress,
                    .goesOn = host.goesOn,
                    .tick = host.tick,
                    .countText =
                        [](size_t pictures) {
                          return TrCount("%1 picture", "%1 pictures", pictures, pictures);
                        }},
                   outcomes, failed);
  const std::string reason = PageFailureHint(status, failed);
  for (uint32_t i = 0; i < count; ++i) {
    const FileOutcome file{.source = files[i].name,
                           .destination = outcomes[i].destination,
                           .status = outcomes[i].status,
                           .hint = outcomes[i].hint};
    if (file.status == Status::Ok && status != Status::Ok) continue;
    if (file.status == Status::Ok) NoteUse(job, file.source, FileFunction::WebGallery);
    ReportOutcome(job, file, i, count);
  }
  if (status == Status::Ok) {
    job.filesChanged = true;
  } else if (status != Status::FunctionCancelled) {
    ReportOutcome(job, {.source = failed, .status = status, .hint = reason}, 0, count);
  }
  FinishProgress(job);
  return status;
}

}  // namespace fotomill::desktop
