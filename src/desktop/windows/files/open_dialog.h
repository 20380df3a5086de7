#pragma once

namespace fotomill::desktop {

class Shell;

// Asks for a picture and opens it. Folder and filter are kept in OpenPath and OpenFilterIndex.
void AskAndOpenFile(Shell& shell);

}  // namespace fotomill::desktop
