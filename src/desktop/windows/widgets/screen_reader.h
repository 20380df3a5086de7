#pragma once

#include <wx/window.h>

namespace fotomill::desktop {

// What screen readers hear of a window, beside what its own texts tell them: `name` says what it
// is, `description` more about it; `name` becomes the window's own name as well. Replaces what was
// told before; an empty description leaves that as it was. The name holds for the parts that a
// control is made of as well, but not for the windows in it.
void ReportToScreenReader(wxWindow& window, const wxString& name, const wxString& description = {});

}  // namespace fotomill::desktop
