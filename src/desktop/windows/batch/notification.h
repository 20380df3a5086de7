#pragma once

#include <wx/toplevel.h>

namespace fotomill::desktop {

// Whether one of the program's windows has the keyboard.
bool InFront();

// Tells the user, who looks at another program, that something has happened: the window asks for
// attention, and the desktop shows a notification where it has a place for them.
void NotifyUser(wxTopLevelWindow& window, const wxString& title, const wxString& text);

}  // namespace fotomill::desktop
