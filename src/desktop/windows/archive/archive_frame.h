#pragma once

#include <string>

namespace fotomill::desktop {

class Shell;

// The archive manager: lists an archive, extracts, tests, views and adds files, in the background.
void ShowArchive(Shell& shell, const std::string& archive);

// Commands of the frame: the manager for the focused archive, or one that is asked for; a new
// archive with the selected files and folders.
void ManageArchive(Shell& shell);
void ArchiveSelection(Shell& shell);

}  // namespace fotomill::desktop
