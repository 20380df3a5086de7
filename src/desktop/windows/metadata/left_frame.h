#pragma once

#include <string>
#include <vector>

namespace fotomill::desktop {

class Shell;

// Reads files in the background and shows which metadata are left in each, in a window of its own.
void ShowMetadataLeft(Shell& shell, std::vector<std::string> files);

}  // namespace fotomill::desktop
