#pragma once

#include <string>

#include "files/file_operation.h"
#include "processing/geometry/orient.h"

namespace fotomill::desktop {

// Turns the picture in a file and keeps the old contents. Neither step nor failure if nothing
// changes.
FileOperationResult TurnOneFile(const std::string& path, Orientation turn);

}  // namespace fotomill::desktop
