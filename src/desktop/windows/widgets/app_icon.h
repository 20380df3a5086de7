#pragma once

#include <wx/bmpbndl.h>

namespace fotomill::desktop {

// The program's icon as an SVG file.
extern const char* const kAppIconSvg;

// The icon in a size of device-independent pixels.
wxBitmapBundle AppIcon(int side);

// Gives the icon to each window and dialog when it is first shown. Call once.
void GiveIconsToWindows();

}  // namespace fotomill::desktop
