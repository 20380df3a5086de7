#pragma once

#include "files/file_operation.h"

namespace fotomill::desktop {

// From the current NumberedVariantMin, NumberedVariantMax, PrefixDuplicate, FilenameUnderbars,
// TextCommentExtension and FileCommentPath.
FileOperationOptions FileOperationOptionsFromSettings();
// How many operations can be undone: UndoLevels.
size_t UndoLimitFromSettings();

}  // namespace fotomill::desktop
