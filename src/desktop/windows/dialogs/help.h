#pragma once

#include <string_view>

class wxWindow;

namespace fotomill::desktop {

// Shows the help for a topic: the name of a key, of a Help button, or of a page (setup_help.h).
void ShowHelp(wxWindow& window, std::string_view topic);

}  // namespace fotomill::desktop
