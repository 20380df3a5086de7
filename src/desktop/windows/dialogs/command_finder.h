#pragma once

namespace fotomill::desktop {

class MainFrame;

// Lets the user find a command by words of its name, and runs it.
void FindCommand(MainFrame& frame);

}  // namespace fotomill::desktop
