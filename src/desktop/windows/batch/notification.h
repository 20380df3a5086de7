#pragma once

#include <wx/toplevel.h>

namespace fotomill::desktop {

// Whether one of the program's windows has the focus.
bool InFront();

// Notifies a user who is in another program: the window requests attention, and the desktop shows a
// notification, if supported.
void NotifyUser(wxTopLevelWindow& window, const wxString& title, const wxString& text);

}  // namespace fotomill::desktop
