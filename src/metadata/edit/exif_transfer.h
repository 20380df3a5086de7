#pragma once

#include <cstdint>
#include <string>

#include "metadata/edit/picture_edit.h"

namespace fotomill {

// Changes that depend on what a file says; for EditPictureExif.

// Moves all dates and times of the camera's clock by so many seconds. A reason when the file has
// none, or when one would leave the calendar.
ExifChanges ShiftedTimes(const ExifDirectories& old, int64_t seconds, std::string& reason);

// What one picture tells another: who took it, when, where and how. Not what is true of its pixels
// alone (orientation, sizes, resolution, color space), and not its maker notes, which do not survive
// a move.
ExifChanges CopiedEntries(const ExifDirectories& from);

}  // namespace fotomill
