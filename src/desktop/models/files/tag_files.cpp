#include "desktop/models/files/tag_files.h"

#include "batch/rewrite/tag_file.h"
#include "files/previous_file.h"
#include "platform/files.h"
#include "settings/job_options.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

TagFilesOptions TagFilesOptionsFromSettings() {
  return {.commentFiles = WritesCommentsFromSettings(), .sources = TagSourcesFromSettings()};
}

FileOperationResult TagFiles(const std::vector<std::string>& paths, const TagChanges& changes,
                             const TagFilesOptions& options,
                             const FileOperationProgress& progress) {
  PreviousFiles previous;
  bool kept = true;
  RewriteRequest request;
  request.keepPrevious = [&](const std::string& path) { return kept = previous.Keep(path); };
  request.replaced = [&](const std::string& path) { previous.Replaced(path); };
  const TagRequest tags{
      .changes = changes, .commentFiles = options.commentFiles, .sources = options.sources};
  FileOperationResult result;
  for (size_t i = 0; i < paths.size(); ++i) {
    const std::string& path = paths[i];
    if (progress && !progress(i, paths.size())) break;
    if (platform::FactsOf(path).link) {
      result.failures.push_back({path, Tr("This is a link; name the file it points to.")});
      continue;
    }
    WriteOptions write;
    write.makeWay = [&] { return request.keepPrevious(path); };
    kept = true;
    const RewrittenFile tagged = TagPictureFile(path, path, tags, request, write);
    if (tagged.changed) previous.Replaced(path);
    if (paths.size() == 1) result.note = tagged.note.shown;
    if (tagged.status == Status::Ok) continue;
    const std::string hint =
        kept ? tagged.hint
             : std::string(Tr("There is not enough disk space to keep the old file for undo."));
    result.failures.push_back({path, StatusText(tagged.status) + (hint.empty() ? "" : " ") + hint});
  }
  result.done = previous.Operation(FileOperationKind::Tag);
  return result;
}

}  // namespace fotomill::desktop
