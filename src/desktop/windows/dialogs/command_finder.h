#pragma once

namespace fotomill::desktop {

class Shell;

// Lets the user search for a command by name, and runs it.
void FindCommand(Shell& shell);

}  // namespace fotomill::desktop
