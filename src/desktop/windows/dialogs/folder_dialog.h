#pragma once

#include <wx/string.h>

#include <optional>
#include <string>

#include "settings/history_list.h"

class wxWindow;

namespace fotomill::desktop {

// Asks for an existing folder, offering `first`, if any, those in a history list and the pictures
// folder as a built-in choice. Moves the answer to the top of the list.
std::optional<std::string> AskForFolder(wxWindow& parent, const wxString& title,
                                        const wxString& verb, HistoryList history,
                                        const std::string& first = {});

}  // namespace fotomill::desktop
