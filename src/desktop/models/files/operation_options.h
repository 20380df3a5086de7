#pragma once

#include "files/file_operation.h"

namespace fotomill::desktop {

// NumberedVariantMin, NumberedVariantMax and PrefixDuplicate, as they are now.
FileOperationOptions FileOperationOptionsFromSettings();
// How many operations can be undone: UndoLevels.
size_t UndoLimitFromSettings();

}  // namespace fotomill::desktop
