#include "desktop/models/files/operation_options.h"

#include <algorithm>

#include "batch/new_job.h"
#include "settings/settings.h"

namespace fotomill::desktop {

FileOperationOptions FileOperationOptionsFromSettings() {
  // those in a folder of their own may belong to pictures of other folders
  const bool beside = settings.FileCommentPath.view().empty();
  return {
      .firstVariant = settings.NumberedVariantMin,
      .lastVariant = settings.NumberedVariantMax,
      .duplicatePrefix = std::string(NewBatchJob().naming.PrefixOf(PrefixedFunction::Duplicate)),
      .commentExtension = std::string(beside ? settings.TextCommentExtension.view() : "")};
}

size_t UndoLimitFromSettings() {
  return static_cast<size_t>(std::clamp(settings.UndoLevels, 0, 1000));
}

}  // namespace fotomill::desktop
