#pragma once

#include <wx/window.h>

#include "desktop/models/view/view_drawing.h"

namespace fotomill::desktop {

// The background of pictures in a window, from the settings and the system's appearance.
Backdrop BackdropFor(const wxWindow& window);

}  // namespace fotomill::desktop
