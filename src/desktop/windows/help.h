#pragma once

#include <string_view>

class wxWindow;

namespace fotomill::desktop {

// Opens the page of the manual for a topic with the system's program for it. Says where the page should be when it cannot.
void ShowHelp(wxWindow& window, std::string_view topic);

}  // namespace fotomill::desktop
