#pragma once

#include <optional>
#include <string>

class wxWindow;

namespace fotomill::desktop {

// Asks for a name to save the tabs, and for confirmation before replacing a set.
std::optional<std::string> AskForTabSetName(wxWindow& parent);
// Lets the user choose a tab set to open, or delete sets.
std::optional<std::string> ChooseTabSet(wxWindow& parent);

}  // namespace fotomill::desktop
