#pragma once

#include <wx/window.h>

#include <vector>

#include "desktop/models/shell/toolbar_buttons.h"

namespace fotomill::desktop {

// The buttons of the toolbar as the user has chosen them, of all that the table of commands has.
std::vector<ToolbarButton> ToolbarButtons();
// Lets the user choose order and set of the buttons. True when they were changed and saved.
bool AskForToolbar(wxWindow& parent);

}  // namespace fotomill::desktop
