#pragma once

namespace fotomill::desktop {

class Shell;

// Lets the user find a command by words of its name, and runs it.
void FindCommand(Shell& shell);

}  // namespace fotomill::desktop
