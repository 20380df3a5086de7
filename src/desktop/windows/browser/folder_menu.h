#pragma once

#include <wx/window.h>

#include <optional>
#include <string>
#include <vector>

#include "desktop/models/browser/path_crumbs.h"

namespace fotomill::desktop {

// Shows a menu of folders below a window, with `current` checked; nullopt if canceled. The window
// must not be destroyed meanwhile.
std::optional<size_t> ChooseFolderFromMenu(wxWindow& window, const std::vector<Crumb>& folders,
                                           const std::string& current);

}  // namespace fotomill::desktop
