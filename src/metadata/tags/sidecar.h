#pragma once

#include <string>
#include <vector>

namespace fotomill {

// Sidecar files hold the XMP of pictures that cannot hold it themselves. Two names are in use:
// "photo.nef.xmp", which belongs to one file, and "photo.xmp".

// Both names for a picture; the first is the one for new sidecars.
std::vector<std::string> SidecarNames(const std::string& picture);

// The existing sidecar of a picture; empty if there is none. "photo.xmp" does not count if it names
// another extension as its own, or if it is the picture itself.
std::string FindSidecar(const std::string& picture);

// The name of the text file with the comment of a picture: "photo.jpg.txt" in `folder`, or beside
// the picture if that is empty.
std::string CommentFileName(const std::string& picture, const std::string& folder,
                            const std::string& extension);

}  // namespace fotomill
