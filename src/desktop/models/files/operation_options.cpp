#include "desktop/models/files/operation_options.h"

#include "settings/settings.h"

namespace fotomill::desktop {

FileOperationOptions FileOperationOptionsFromSettings() {
  return {.firstVariant = settings.NumberedVariantMin, .lastVariant = settings.NumberedVariantMax};
}

}  // namespace fotomill::desktop
