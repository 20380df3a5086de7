#include "batch/rewrite/edit_run.h"

#include "batch/recipe_function.h"
#include "batch/rewrite/rewrite_run.h"
#include "texts/texts.h"

namespace fotomill {

Status RunEdit(std::span<const BatchFile> files, const EditFunction& function, BatchJob& job) {
  const auto edit = [&](const std::string& source, const std::string& destination,
                        const RewriteRequest& rewriting, const WriteOptions& options) {
    const auto own = function.recipes.find(source);
    if (own == function.recipes.end())
      return EditPictureFile(source, destination, function.request, rewriting, job.read, options);
    EditRequest request = function.request;
    request.recipe = own->second;
    return EditPictureFile(source, destination, request, rewriting, job.read, options);
  };
  const auto keep = [&](const std::string& path) {
    return (!function.keepPrevious || function.keepPrevious(path)) &&
           (!function.backups || KeepBackup(path));
  };
  const Operation* const first = function.request.recipe->First();
  return RunRewrite(
      files,
      {.rewrite = edit,
       .listedTwice = TrLater("listed twice; already changed."),
       .history = first == nullptr ? FileFunction::Effects : FunctionOfFamily(first->family),
       .inPlace = true,
       .jobs = function.jobs,
       .keepPrevious = keep,
       .replaced = function.replaced},
      job);
}

}  // namespace fotomill
