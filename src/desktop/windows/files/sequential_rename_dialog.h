#pragma once

namespace fotomill::desktop {

class Shell;

// The box "Sequential Rename" for the frame's selection: numbers the files, shows their new names
// first.
void RenameSelectionSequentially(Shell& shell);

}  // namespace fotomill::desktop
