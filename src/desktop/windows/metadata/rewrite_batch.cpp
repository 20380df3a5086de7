#include "desktop/windows/metadata/rewrite_batch.h"

#include <wx/frame.h>

#include "batch/new_job.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/shell/shell.h"
#include "files/previous_file.h"

namespace fotomill::desktop {

void RunRewriteBatch(Shell& shell, const std::vector<std::string>& files, RewriteFunction function,
                     const std::string& folder, const std::weak_ptr<bool>& alive,
                     std::function<void(bool errors)> done) {
  if (folder.empty() && RefusesChange(&shell.Window(), files)) return done(true);
  std::vector<BatchFile> batch;
  for (const std::string& file : files) batch.push_back({.name = file, .below = {}, .hint = {}});
  auto previous = std::make_shared<PreviousFiles>(FileOperationKind::Change);
  function.inPlace = folder.empty();
  if (function.inPlace) {
    function.keepPrevious = [previous](const std::string& path) { return previous->Keep(path); };
    function.replaced = [previous](const std::string& path) { previous->Replaced(path); };
  }
  BatchJob job = NewBatchJob();
  job.destinationFolder = folder;
  shell.Batches().Run(
      std::move(job),
      [&shell, batch = std::move(batch), function = std::move(function), alive,
       done = std::move(done)](BatchJob& running) {
        const Status status = RunRewrite(batch, function, running);
        shell.Window().CallAfter([alive, done, errors = running.errors || status != Status::Ok] {
          if (!alive.expired()) done(errors);
        });
        return status;
      },
      previous);
}

}  // namespace fotomill::desktop
