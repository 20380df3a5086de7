#pragma once

#include <string>
#include <vector>

#include "batch/batch_file.h"

namespace fotomill::cli {

// Sorts a selection by "name" (natural order of whole paths), "time" (modification time), "taken"
// (EXIF date, else modification time) or "size"; no change for any other value. Ties are sorted by
// name.
void SortFiles(const std::string& by, std::vector<BatchFile>& files);

}  // namespace fotomill::cli
