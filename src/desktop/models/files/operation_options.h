#pragma once

#include "files/file_operation.h"

namespace fotomill::desktop {

// NumberedVariantMin and NumberedVariantMax, as they are now; thumbnails of files that are replaced
// go.
FileOperationOptions FileOperationOptionsFromSettings();

}  // namespace fotomill::desktop
