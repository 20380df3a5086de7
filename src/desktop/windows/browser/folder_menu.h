#pragma once

#include <wx/window.h>

#include <optional>
#include <string>
#include <vector>

#include "desktop/models/browser/path_crumbs.h"

namespace fotomill::desktop {

// Lets the user choose one of some folders in a menu below a window; the folder `current` has a
// mark. nullopt when none was chosen. The window may not go meanwhile.
std::optional<size_t> ChooseFolderFromMenu(wxWindow& window, const std::vector<Crumb>& folders,
                                           const std::string& current);

}  // namespace fotomill::desktop
