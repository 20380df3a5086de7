#include "desktop/models/files/operation_options.h"

#include "desktop/models/thumbnails/thumbnail.h"
#include "settings/settings.h"

namespace fotomill::desktop {

FileOperationOptions FileOperationOptionsFromSettings() {
  return {.firstVariant = settings.NumberedVariantMin,
          .lastVariant = settings.NumberedVariantMax,
          .replacing = DropThumbnails};
}

}  // namespace fotomill::desktop
