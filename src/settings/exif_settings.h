#pragma once

#include <string>

#include "metadata/edit/picture_edit.h"

namespace fotomill {

// The path from ExifLocationsFile; a plain name is in the data folder.
std::string LocationsPath();

// Reads the list of places in that file, as text. Returns an error message, empty on success.
std::string ReadLocations(std::string& list);

// Changes for all Exif keys that are set; tags of empty keys are not changed. False, with a reason,
// for a value that the tag does not allow, and if no key is set.
[[nodiscard]] bool OwnerChanges(ExifChanges& changes, std::string& reason);

}  // namespace fotomill
