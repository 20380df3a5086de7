#pragma once

namespace fotomill::desktop {

class Shell;

// The command: sets the times of the frame's selected files, which can be undone, after a dialog
// with a preview.
void SetTimesOfSelection(Shell& shell);

}  // namespace fotomill::desktop
