#pragma once

#include <string>
#include <vector>

#include "files/rename_log.h"

namespace fotomill {

// What goes along with a picture that is renamed or removed, as absolute paths if that of the
// picture is: "photo.nef.xmp" always; "photo.xmp" if it names the picture's extension as its own,
// or else with the last picture of that name, as it may be shared; and the comment file
// "photo.nef.txt", for the extension "txt", unless the picture has no extension of its own. No
// extension: there are no comment files.

// The files that move along when a picture gets a new path, with theirs. If it is `copied`, those
// that it shares, too.
std::vector<RenamedFile> SidecarMoves(const std::string& from, const std::string& to,
                                      const std::string& commentExtension = {},
                                      bool copied = false);
// The files that are removed with a picture.
std::vector<std::string> SidecarsOf(const std::string& picture,
                                    const std::string& commentExtension = {});

}  // namespace fotomill
