#pragma once

#include <cstdint>
#include <string>

namespace fotomill {

// Times of the last removal of orphaned thumbnail files per folder, stored in the file
// "FMWThumbnailCleanUp.txt" in the data folder: lines "SECONDS,FOLDER", seconds since 1970 UTC,
// latest first, at most 5,000 folders. A check of a database has its path in place of FOLDER.

// 0: never or unknown.
int64_t LastOrphanRemoval(const std::string& folder);
// False if it could not be written; a file that cannot be read is left unchanged.
bool KeepOrphanRemoval(const std::string& folder, int64_t time);

}  // namespace fotomill
