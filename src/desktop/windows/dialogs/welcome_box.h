#pragma once

#include <string>

namespace fotomill::desktop {

// Welcomes a new user, before the main window: asks for the folder of the pictures, how to keep
// thumbnails, and the language, and stores the answers. Escape changes nothing. Returns the folder
// to open, which becomes a favorite; empty: the usual one.
std::string ShowWelcome();

}  // namespace fotomill::desktop
