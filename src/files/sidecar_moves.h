#pragma once

#include <string>
#include <vector>

#include "files/rename_log.h"

namespace fotomill {

// The sidecars that go along when a picture is renamed or moved, with their new names; absolute
// paths if those of the picture are. "photo.nef.xmp" always does. "photo.xmp" does if it names the
// picture's extension as its own, or else with the last picture of that name, as it may be shared.
std::vector<RenamedFile> SidecarMoves(const std::string& from, const std::string& to);

}  // namespace fotomill
