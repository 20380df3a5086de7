#pragma once

#include <string_view>

class wxWindow;

namespace fotomill::desktop {

// Shows help on a topic: the name of a key, Help button, or page (setup_help.h).
void ShowHelp(wxWindow& window, std::string_view topic);

}  // namespace fotomill::desktop
