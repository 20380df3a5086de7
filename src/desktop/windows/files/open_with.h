#pragma once

#include <string>
#include <vector>

class wxMenu;

namespace fotomill::desktop {

class Shell;

// A new menu of the programs registered for files like the first of these; each opens all of them.
// Null if there are none.
wxMenu* NewOpenWithMenu(Shell& shell, const std::vector<std::string>& files);

}  // namespace fotomill::desktop
