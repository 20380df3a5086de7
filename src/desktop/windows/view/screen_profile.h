#pragma once

#include <cstdint>
#include <vector>

namespace fotomill::desktop {

// The color profile of the screen: X11 desktops store that of the first monitor at the root window.
// Empty if there is none, and on other systems.
std::vector<uint8_t> ReadScreenProfile();

}  // namespace fotomill::desktop
