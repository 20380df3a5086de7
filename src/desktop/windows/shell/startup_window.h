#pragma once

namespace fotomill {
struct EarlySettings;
}

namespace fotomill::desktop {

// Shows the program's name and version at the center of the screen, if ShowStartupWindow is on, for
// LogoDelay milliseconds or until a click or key press.
void ShowStartupWindow(const EarlySettings& early);

}  // namespace fotomill::desktop
