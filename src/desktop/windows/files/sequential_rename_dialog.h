#pragma once

namespace fotomill::desktop {

class Shell;

// The dialog "Sequential Rename" for the frame's selection: numbers the files, with a preview of
// the new names.
void RenameSelectionSequentially(Shell& shell);

}  // namespace fotomill::desktop
