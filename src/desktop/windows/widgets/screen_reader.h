#pragma once

#include <wx/window.h>

namespace fotomill::desktop {

// Sets what screen readers announce for a window besides its own text: `name` identifies it and
// also becomes the window's name, `description` adds details. Replaces earlier values; an empty
// description keeps the old one. The name also applies to a control's internal parts, but not to
// child windows.
void ReportToScreenReader(wxWindow& window, const wxString& name, const wxString& description = {});

}  // namespace fotomill::desktop
