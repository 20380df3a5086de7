#pragma once

#include <cstdint>
#include <vector>

namespace fotomill::desktop {

// The color profile of the screen where the desktop says it: X11 desktops keep that of the first
// monitor at the root window. Empty if there is none, and on other systems.
std::vector<uint8_t> ReadScreenProfile();

}  // namespace fotomill::desktop
