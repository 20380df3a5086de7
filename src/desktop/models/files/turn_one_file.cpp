#include "desktop/models/files/turn_one_file.h"

#include "batch/rewrite/turn_file.h"
#include "catalog/thumbnails/picture_changes.h"
#include "files/previous_file.h"
#include "platform/files.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

FileOperationResult TurnOneFile(const std::string& path, Orientation turn) {
  if (platform::FactsOf(path).link)
    return {{FileOperationKind::Turn, {}},
            {{path, Tr("This is a link; rotate the file it points to.")}}};
  PreviousFiles previous;
  WriteOptions options{.encode = EncodeOptionsFromSettings()};
  bool kept = true;
  options.makeWay = [&] { return kept = previous.Keep(path); };
  const TurnRequest request{.turn = turn, .seenByExif = settings.ExifAdjustOrientation != 0};
  const RewrittenFile turned =
      TurnPictureFile(path, path, request, ReadOptionsFromSettings(), options);
  if (turned.changed) {
    previous.Replaced(path);
    DeleteThumbnailFile(path);
    MarkChangedRecords({{PictureChange{path}}});
  }
  FileOperationResult result{previous.Operation(), {}, turned.note.shown};
  if (turned.status != Status::Ok) {
    const std::string hint =
        kept ? turned.hint
             : std::string(Tr("There is not enough disk space to keep the old file for undo."));
    result.failures.push_back({path, StatusText(turned.status) + (hint.empty() ? "" : " ") + hint});
  }
  return result;
}

}  // namespace fotomill::desktop
