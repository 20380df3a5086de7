#include "desktop/models/files/operation_options.h"

#include <algorithm>

#include "settings/settings.h"

namespace fotomill::desktop {

FileOperationOptions FileOperationOptionsFromSettings() {
  return {.firstVariant = settings.NumberedVariantMin,
          .lastVariant = settings.NumberedVariantMax,
          .duplicatePrefix = std::string(settings.PrefixDuplicate.view())};
}

size_t UndoLimitFromSettings() {
  return static_cast<size_t>(std::clamp(settings.UndoLevels, 0, 1000));
}

}  // namespace fotomill::desktop
