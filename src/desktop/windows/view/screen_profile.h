#pragma once

#include <cstdint>
#include <vector>

class wxWindow;

namespace fotomill::desktop {

// Reads the color profiles of all screens and sets them for pictures: X11 desktops store them at
// the root window. Call at the start, and when the screens have changed.
void TakeScreenProfiles();

// The number of the screen that shows most of a window.
size_t ScreenOf(const wxWindow& window);

}  // namespace fotomill::desktop
