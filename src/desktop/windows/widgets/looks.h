#pragma once

#include <wx/colour.h>
#include <wx/window.h>

#include "desktop/models/drawing/list_palette.h"

namespace fotomill::desktop {

// The colors of own drawings, from those of the system as they are now.
ListPalette CurrentPalette();
// Of texts about what went wrong, in a window among the system's controls.
wxColour FaultColor();
// Of a bar that stands out of its window a little.
wxColour BarColor();

// How much larger texts are than usual, at least 1.
double TextScale(const wxWindow& window);
// A width for text, given for texts of the usual size: wider where the user wants larger ones.
int TextWidth(const wxWindow& window, int width);

// The same color for the toolkit.
inline wxColour ToWx(Shade shade) { return {shade.red, shade.green, shade.blue}; }

}  // namespace fotomill::desktop
