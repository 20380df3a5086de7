#pragma once

namespace fotomill::desktop {

class Shell;

// Further windows, as commands of the frame.
void ShowSetup(Shell& shell);
void ShowInfo(Shell& shell);  // for the selected files
void ShowExif(Shell& shell);  // for the first selected file
void ShowFileHistory(Shell& shell);  // modal
void ShowCompaction(Shell& shell);   // for a thumbnail database; modal
void ShowCleanUp(Shell& shell);  // for the current folder
void ShowPlugins(Shell& shell);  // modal
void ShowManual(Shell& shell);   // as a help page
void ShowConfigurationHelp(Shell& shell);
void ShowAbout(Shell& shell);  // modal

}  // namespace fotomill::desktop
