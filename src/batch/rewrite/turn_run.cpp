#include "batch/rewrite/turn_run.h"

#include "batch/rewrite/rewrite_run.h"
#include "texts/texts.h"

namespace fotomill {

Status RunTurn(std::span<const BatchFile> files, const TurnFunction& function, BatchJob& job) {
  const auto turn = [&](const std::string& source, const std::string& destination,
                        const RewriteRequest& rewriting, const WriteOptions& options) {
    TurnRequest request = function.request;
    request.stop = rewriting.stop;
    return TurnPictureFile(source, destination, request, job.read, options);
  };
  return RunRewrite(files,
                    {.rewrite = turn,
                     .unchanged = TrLater("already in this orientation."),
                     .listedTwice = TrLater("listed twice; already turned."),
                     .history = FileFunction::Transform,
                     .inPlace = function.inPlace,
                     .out = function.out,
                     .keepTree = function.keepTree,
                     .keepTimes = function.request.keepTime,
                     .dryRun = function.request.dryRun,
                     .jobs = function.jobs,
                     .keepPrevious = function.keepPrevious,
                     .replaced = function.replaced},
                    job);
}

}  // namespace fotomill
