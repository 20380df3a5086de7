#pragma once

#include <wx/window.h>

#include <string>

namespace fotomill::desktop {

// Actions on a text shown in a window.
void CopyText(const wxString& text);
// Asks for a file and writes the text; shows a message on failure. `name` is the suggested name.
void SaveTextAs(wxWindow& parent, const wxString& name, const std::string& text);
// Prints a text in a fixed-width font, using the system's dialog.
void PrintText(wxWindow& parent, const wxString& title, const std::string& text);

}  // namespace fotomill::desktop
