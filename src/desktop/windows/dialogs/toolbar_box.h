#pragma once

#include <wx/window.h>

#include <vector>

#include "desktop/models/shell/toolbar_buttons.h"

namespace fotomill::desktop {

// The toolbar buttons as chosen by the user, from the table of commands.
std::vector<ToolbarButton> ToolbarButtons();
// Lets the user choose and order the buttons. True if they were changed and saved.
bool AskForToolbar(wxWindow& parent);

}  // namespace fotomill::desktop
