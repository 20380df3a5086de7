#pragma once

#include <string>
#include <vector>

#include "batch/run.h"

namespace fotomill::cli {

// Sorts a selection by "name" (natural order of whole paths), "time" of modification, "taken" (the
// EXIF date, without one the time of modification) or "size"; other words leave it as it is. Equal
// files are in the order of their names.
void SortFiles(const std::string& by, std::vector<BatchFile>& files);

}  // namespace fotomill::cli
