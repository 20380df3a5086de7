#include "desktop/models/files/operation_options.h"

#include <algorithm>

#include "batch/new_job.h"
#include "settings/job_options.h"
#include "settings/settings.h"

namespace fotomill::desktop {

FileOperationOptions FileOperationOptionsFromSettings() {
  return {
      .firstVariant = settings.NumberedVariantMin,
      .lastVariant = settings.NumberedVariantMax,
      .duplicatePrefix = std::string(NewBatchJob().naming.PrefixOf(PrefixedFunction::Duplicate)),
      .commentExtension = CommentExtensionBesideFromSettings()};
}

size_t UndoLimitFromSettings() {
  return static_cast<size_t>(std::clamp(settings.UndoLevels, 0, 1000));
}

}  // namespace fotomill::desktop
