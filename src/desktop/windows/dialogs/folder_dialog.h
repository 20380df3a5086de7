#pragma once

#include <wx/string.h>

#include <optional>
#include <string>

#include "settings/history_list.h"

class wxWindow;

namespace fotomill::desktop {

// Asks for a folder that is there, offering those of a history list, and puts the answer first in
// it.
std::optional<std::string> AskForFolder(wxWindow& parent, const wxString& title,
                                        const wxString& verb, HistoryList history);

}  // namespace fotomill::desktop
