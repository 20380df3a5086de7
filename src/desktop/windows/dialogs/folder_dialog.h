#pragma once

#include <wx/string.h>

#include <optional>
#include <string>

#include "settings/history_list.h"

class wxWindow;

namespace fotomill::desktop {

// Asks for a folder that is there, offering those of a history list and the pictures folder, which
// is the list's built-in choice. Puts the answer first in the list.
std::optional<std::string> AskForFolder(wxWindow& parent, const wxString& title,
                                        const wxString& verb, HistoryList history);

}  // namespace fotomill::desktop
