#pragma once

namespace fotomill::desktop {

class Shell;

// The command: removes metadata from the frame's selected files. Depending on SecureEXIFPrompt and
// SecureEXIFPreview, asks what to remove, and shows what is removed and what is left.
void StripSelection(Shell& shell);

}  // namespace fotomill::desktop
