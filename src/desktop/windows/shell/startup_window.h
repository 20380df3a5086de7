#pragma once

namespace fotomill {
struct EarlySettings;
}

namespace fotomill::desktop {

// Shows the program's name and version in the middle of the screen if ShowStartupWindow is on, for
// LogoDelay milliseconds or until a click or key.
void ShowStartupWindow(const EarlySettings& early);

}  // namespace fotomill::desktop
