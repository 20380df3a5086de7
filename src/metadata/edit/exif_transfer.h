#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "metadata/edit/picture_edit.h"

namespace fotomill {

// Changes computed from a file's entries; for EditPictureExif.

// Changes that write the wanted entries of a file into another one, in little endian.
ExifChanges TakenEntries(const ExifDirectories& from,
                         const std::function<bool(const ExifEntry&, ExifPlace)>& isWanted);

// Shifts all dates and times of the camera's clock. Sets a reason if there are none, or if a result
// is not a valid date.
ExifChanges ShiftedTimes(const ExifDirectories& old, int64_t seconds, std::string& reason);

// The entries to copy from one picture to another: who took it, when, where and how. Excludes
// entries about its own pixels (orientation, size, resolution, color space), and the maker notes,
// which do not survive a move.
ExifChanges CopiedEntries(const ExifDirectories& from);

}  // namespace fotomill
