#pragma once

namespace fotomill::desktop {

class MainFrame;

// The box "Sequential Rename" for the frame's selection: numbers the files, shows their new names first.
void RenameSelectionSequentially(MainFrame& frame);

}  // namespace fotomill::desktop
