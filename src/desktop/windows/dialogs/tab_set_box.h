#pragma once

#include <optional>
#include <string>

class wxWindow;

namespace fotomill::desktop {

// Asks for the name under which the tabs are to be kept, and before another set is replaced.
std::optional<std::string> AskForTabSetName(wxWindow& parent);
// Lets the user choose a set to open, and delete sets.
std::optional<std::string> ChooseTabSet(wxWindow& parent);

}  // namespace fotomill::desktop
