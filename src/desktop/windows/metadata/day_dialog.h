#pragma once

#include <optional>
#include <string>

class wxWindow;

namespace fotomill::desktop {

// Asks for a day with a calendar, which starts at the day in `text`, "2024-05-31...", if it is one.
// Returns the day in that form; none if canceled.
std::optional<std::string> AskForDay(wxWindow& parent, const std::string& text);

}  // namespace fotomill::desktop
