#pragma once

#include <cstdint>
#include <string>

namespace fotomill {

// When thumbnail files without a picture were last removed from a folder, kept for later runs in
// the file "FMWThumbnailCleanUp.txt" of the data folder: a line "SECONDS,FOLDER" each, seconds
// since 1970 UTC, the latest first, 5,000 folders at most.

// 0: never, or it is not known.
int64_t LastOrphanRemoval(const std::string& folder);
// False when it could not be written; a file that cannot be read is left alone.
bool KeepOrphanRemoval(const std::string& folder, int64_t time);

}  // namespace fotomill
