#pragma once

#include <wx/window.h>

#include <string>

namespace fotomill::desktop {

// What a window can do with a text that it shows.
void CopyText(const wxString& text);
// Asks for a file and writes the text, with a message if that fails. `name` is offered.
void SaveTextAs(wxWindow& parent, const wxString& name, const std::string& text);
// Prints a text, page by page in a fixed font, through the system's dialog.
void PrintText(wxWindow& parent, const wxString& title, const std::string& text);

}  // namespace fotomill::desktop
