#pragma once

class wxWindow;

namespace fotomill::desktop {

// Shows the version of the program, and versions and licenses of its libraries. Modal.
void ShowAboutBox(wxWindow& parent);

}  // namespace fotomill::desktop
