#pragma once

#include <wx/colour.h>
#include <wx/window.h>

#include "desktop/models/drawing/list_palette.h"

namespace fotomill::desktop {

// Colors for owner-drawn windows, from the current system colors.
ListPalette CurrentPalette();
// For error messages among system controls.
wxColour FaultColor();
// For a bar that is slightly set off from its window.
wxColour BarColor();

// Scale of texts relative to the normal size, at least 1.
double TextScale(const wxWindow& window);
// Scales a width given for the normal text size.
int TextWidth(const wxWindow& window, int width);

// Converts to the toolkit's color type.
inline wxColour ToWx(Shade shade) { return {shade.red, shade.green, shade.blue}; }

}  // namespace fotomill::desktop
