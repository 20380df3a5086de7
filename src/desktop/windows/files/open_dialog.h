#pragma once

namespace fotomill::desktop {

class Shell;

// Asks for a picture and opens it. Remembers folder and filter in OpenPath and OpenFilterIndex.
void AskAndOpenFile(Shell& shell);

}  // namespace fotomill::desktop
